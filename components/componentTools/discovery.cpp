// SPDX-License-Identifier: BSL-1.0
/// Repeats the manager's own rules, with the manager's functions: normalised names, one record for
/// each file, and all folders listed in one call. In addition, reports what the manager skips
/// silently, because its name cannot be encoded or recorded.
#include "components/componentTools/discovery.h"

#include "components/componentManager/files.h"
#include "components/componentManager/nativeText.h"
#include "components/componentTools/inspecting/inspection.h"
#include "components/componentTools/recordedList.h"
#include "components/platform/pathNormaliser.h"
#include "components/platform/platform.h"
#include "components/platform/searchPath.h"

#include <cstddef>
#include <map>
#include <memory>
#include <optional>
#include <string_view>
#include <system_error>
#include <utility>

namespace Mz::Tools {

namespace {

/// Returns the full path; `path` unchanged if the current folder no longer exists.
std::filesystem::path fullPathOf(const std::filesystem::path& path) {
    std::error_code failure;
    const std::filesystem::path absolute = std::filesystem::absolute(path, failure);
    return failure ? path : fullPath(absolute);
}

/// Returns whether a search path can contain the folder.
bool isSearchable(const std::wstring& folder) {
    return folder.find(platform::searchPathSeparator<wchar_t>) == std::wstring::npos;
}

class Discoverer {
  public:
    void add(const std::filesystem::path& folder) {
        const std::optional<std::wstring> name = toWideName(folder);
        if (!name || !isCarried(*name))
            return leaveOutFolder(folder, Verdict::nameNotCarried);
        if (!isSearchable(*name))
            return leaveOutFolder(folder, Verdict::notSearchable);
        const std::wstring directory = normalisePath(name->c_str(), false);
        const std::filesystem::path opened = platform::openingPath(directory, {}, folder.native());
        std::error_code failure;
        const std::filesystem::file_status status = std::filesystem::status(opened, failure);
        if (failure || !std::filesystem::exists(status))
            return leaveOutFolder(folder, verdictOnAbsence(opened));
        if (!std::filesystem::is_directory(status))
            return leaveOutFolder(folder, Verdict::notAFolder);
        std::filesystem::directory_iterator entries(opened, failure);
        if (failure)
            return leaveOutFolder(folder, Verdict::unreadable);
        directories.push_back(directory);
        openedNames.push_back(opened.native());
        leaveOutUnnamed(std::move(entries));
    }

    Discovery take() {
        // In one call, like the manager: only then are identities comparable between folders.
        std::vector<bool> unlisted;
        const auto listings = platform::listCandidates(openedNames, &unlisted);
        for (std::size_t index = 0; index < listings.size(); ++index) {
            if (unlisted[index])
                leaveOutFolder(openedNames[index], Verdict::unreadable);
            for (const platform::DirectoryEntry& entry : listings[index])
                add(directories[index], entry);
        }
        return std::move(result);
    }

  private:
    void add(const std::wstring& directory, const platform::DirectoryEntry& entry) {
        // A file has one record, even if several folders or names lead to it.
        if (entry.identity) {
            const auto [other, isFirst] = seen.emplace(*entry.identity, entry.path);
            if (!isFirst && platform::isSameFile(other->second, entry.path))
                return;
        }
        Candidate candidate{entry.path, directory, normalisePath(entry.name.c_str(), false)};
        const auto [known, isNew] =
            names.emplace(std::pair(directory, candidate.fileName), entry.path);
        if (!isNew && !entry.identity)
            return;
        if (!isCarried(candidate.fileName))
            leaveOut(entry.path, {Verdict::nameNotCarried, {}, {}});
        else if (!isNew)
            leaveOut(entry.path, {Verdict::sameName, displayName(known->second), {}});
        else
            result.candidates.push_back(std::move(candidate));
    }

    void leaveOut(const std::filesystem::path& path, const Finding& finding) {
        result.leftOut.push_back({path, finding});
    }

    void leaveOutFolder(const std::filesystem::path& folder, Verdict verdict) {
        result.leftOut.push_back({folder, {verdict, {}, {}}, true});
    }

    /// Reports names that have no wide form. `listCandidates` skips them silently.
    void leaveOutUnnamed(std::filesystem::directory_iterator entry) {
        std::error_code failure;
        for (const std::filesystem::directory_iterator end; !failure && entry != end;
             entry.increment(failure))
            if (!toWideName(entry->path()))
                leaveOut(entry->path(), {Verdict::nameNotCarried, {}, {}});
    }

    Discovery result;
    std::vector<std::wstring> directories; ///< the folders to list, normalised
    std::vector<platform::NativePath> openedNames;
    std::map<platform::FileIdentity, platform::NativePath> seen;
    std::map<std::pair<std::wstring, std::wstring>, std::filesystem::path> names;
};

} // namespace

std::vector<std::filesystem::path> foldersOf(const std::filesystem::path& searchPath) {
    using Text = std::basic_string_view<std::filesystem::path::value_type>;
    std::vector<std::filesystem::path> folders;
    Text rest = searchPath.native();
    for (Text folder; !(folder = platform::takeDirectory(rest)).empty();)
        folders.push_back(fullPathOf(folder));
    return folders;
}

std::wstring searchPathOf(const std::vector<std::filesystem::path>& folders) {
    constexpr wchar_t separator[] = {platform::searchPathSeparator<wchar_t>, L'\0'};
    std::wstring searchPath;
    for (const std::filesystem::path& folder : folders) {
        const std::optional<std::wstring> name = toWideName(folder);
        if (name && isCarried(*name) && isSearchable(*name))
            searchPath += (searchPath.empty() ? L"" : separator) + *name;
    }
    return searchPath;
}

Discovery discover(const std::vector<std::filesystem::path>& folders) {
    Discoverer discoverer;
    for (const std::filesystem::path& folder : folders)
        discoverer.add(folder);
    return discoverer.take();
}

Candidate candidateOf(const std::filesystem::path& file) {
    Candidate candidate{fullPathOf(file), {}, {}};
    if (const auto directory = toWideName(candidate.path.parent_path()))
        candidate.directory = normalisePath(directory->c_str(), false);
    if (const auto name = toWideName(candidate.path.filename()))
        candidate.fileName = normalisePath(name->c_str(), false);
    return candidate;
}

std::wstring displayName(const std::filesystem::path& path) {
    return Mz::displayName(path);
}

} // namespace Mz::Tools
