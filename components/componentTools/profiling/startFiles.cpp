// SPDX-License-Identifier: BSL-1.0
/// Repeats the manager's listing and its match of records, with the functions of the platform layer
/// that the manager uses, so that the time of a listing is comparable.
#include "components/componentTools/profiling/startFiles.h"

#include "components/platform/pathNormaliser.h"
#include "components/platform/searchPath.h"

#include <map>
#include <set>
#include <string_view>
#include <utility>

namespace Mz::Tools {

namespace {

using NameView = std::pair<std::wstring_view, std::wstring_view>;

/// The files that were listed already, under this or another name.
class ListedFiles {
  public:
    /// Returns whether the file is new, and notes it.
    bool add(const platform::DirectoryEntry& entry, const StartFile& file) {
        if (!entry.identity)
            return names.emplace(file.directory, file.fileName).second;
        const auto [other, isNew] = files.emplace(*entry.identity, entry.path);
        return isNew || !platform::isSameFile(other->second, entry.path);
    }

  private:
    std::map<platform::FileIdentity, platform::NativePath> files;
    std::set<std::pair<std::wstring, std::wstring>> names;
};

} // namespace

std::vector<StartFile> listStartFiles(const std::wstring& searchPath) {
    std::vector<std::wstring> directories;
    std::vector<platform::NativePath> openedNames;
    std::wstring_view rest(searchPath);
    for (std::wstring_view folder; !(folder = platform::takeDirectory(rest)).empty();) {
        const std::optional<platform::NativePath> native = platform::toNative(folder);
        if (!native)
            continue;
        directories.push_back(normalisePath(std::wstring(folder).c_str(), false));
        openedNames.push_back(platform::openingPath(directories.back(), {}, *native));
    }
    std::vector<StartFile> files;
    ListedFiles listed;
    const auto listings = platform::listCandidates(openedNames);
    for (std::size_t index = 0; index < listings.size(); ++index)
        for (const platform::DirectoryEntry& entry : listings[index]) {
            StartFile file{directories[index], normalisePath(entry.name.c_str(), false),
                           entry.path};
            if (listed.add(entry, file))
                files.push_back(std::move(file));
        }
    return files;
}

void findRecords(std::vector<StartFile>& files, const RecordedLibraries& recorded) {
    std::map<NameView, std::vector<const RecordedLibrary*>> records;
    for (const RecordedLibrary& record : recorded)
        records[{record.directory, record.fileName}].push_back(&record);
    std::map<NameView, std::vector<StartFile*>> groups;
    for (StartFile& file : files)
        groups[{file.directory, file.fileName}].push_back(&file);
    for (const auto& [name, group] : groups) {
        const auto found = records.find(name);
        if (found == records.end())
            continue;
        // Without letter case, the last record of a name counts. With it, the manager matches equal
        // numbers of files and records one by one, and ignores the records otherwise.
        if (platform::namesIgnoreCase())
            group.front()->record = found->second.back();
        else if (found->second.size() == group.size())
            for (std::size_t index = 0; index < group.size(); ++index)
                group[index]->record = found->second[index];
    }
}

bool isUnchanged(const StartFile& file, const platform::FileStatus& status) {
    return file.record && file.record->time == status.time && file.record->size == status.size;
}

} // namespace Mz::Tools
