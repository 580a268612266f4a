#include "components/componentTools/discovery.h"

#include "components/componentManager/pathNormaliser.h"
#include "components/componentManager/platform/platform.h"
#include "components/componentTools/platform/system.h"
#include "components/componentTools/recordedList.h"

#include <map>
#include <system_error>

namespace Mz::Tools {

namespace {

/// A full path without ".", ".." and a separator at the end.
std::filesystem::path fullPath(const std::filesystem::path& path) {
    std::error_code failure;
    std::filesystem::path full = System::withoutDots(std::filesystem::absolute(path, failure));
    if (!full.has_filename() && full.has_relative_path())
        full = full.parent_path();
    full.make_preferred();
    return full;
}

/// Whether a search path can lead there.
bool isSearchable(const std::wstring& folder) {
    return folder.find(L';') == std::wstring::npos;
}

class Discoverer {
  public:
    void add(const std::filesystem::path& folder) {
        const std::optional<std::wstring> name = System::nameText(folder);
        if (!name || !isCarried(*name))
            return leaveOutFolder(folder, Verdict::nameNotCarried);
        if (!isSearchable(*name))
            return leaveOutFolder(folder, Verdict::notSearchable);
        const std::wstring directory = normalisePath(name->c_str(), false);
        const std::filesystem::path opened = platform::openingPath(directory, {}, folder.native());
        std::error_code failure;
        if (!std::filesystem::is_directory(opened, failure))
            return leaveOutFolder(folder, failure == std::errc::permission_denied
                                              ? Verdict::unreadable
                                              : Verdict::missing);
        std::filesystem::directory_iterator entries(opened, failure);
        if (failure)
            return leaveOutFolder(folder, Verdict::unreadable);
        directories.push_back(directory);
        openedNames.push_back(opened.native());
        leaveOutUnnamed(std::move(entries));
    }

    Discovery take() {
        // All at once, as the manager does: so one file is known by its names in several folders.
        const auto listings = platform::listCandidates(openedNames);
        for (std::size_t index = 0; index < listings.size(); ++index)
            for (const platform::DirectoryEntry& entry : listings[index])
                add(directories[index], entry);
        return std::move(result);
    }

  private:
    void add(const std::wstring& directory, const platform::DirectoryEntry& entry) {
        // One file, one record, however often the search path leads to it.
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
            leaveOut(entry.path, {Verdict::sameName, System::displayName(known->second), {}});
        else
            result.candidates.push_back(std::move(candidate));
    }

    void leaveOut(const std::filesystem::path& path, const Finding& finding) {
        result.leftOut.push_back({path, finding});
    }

    void leaveOutFolder(const std::filesystem::path& folder, Verdict verdict) {
        result.leftOut.push_back({folder, {verdict, {}, {}}, true});
    }

    /// Names that are no text are passed over silently by the manager's own listing.
    void leaveOutUnnamed(std::filesystem::directory_iterator entry) {
        std::error_code failure;
        for (const std::filesystem::directory_iterator end; !failure && entry != end;
             entry.increment(failure))
            if (!System::nameText(entry->path()))
                leaveOut(entry->path(), {Verdict::nameNotCarried, {}, {}});
    }

    Discovery result;
    std::vector<std::wstring> directories; ///< to list, normalised
    std::vector<platform::NativePath> openedNames;
    std::map<platform::FileIdentity, platform::NativePath> seen;
    std::map<std::pair<std::wstring, std::wstring>, std::filesystem::path> names;
};

} // namespace

std::vector<std::filesystem::path> foldersOf(const std::filesystem::path& searchPath) {
    using Text = std::filesystem::path::string_type;
    std::vector<std::filesystem::path> folders;
    const Text& text = searchPath.native();
    for (std::size_t start = 0; start <= text.size();) {
        const std::size_t end = std::min(text.find(Text::value_type(';'), start), text.size());
        if (end > start)
            folders.push_back(fullPath(text.substr(start, end - start)));
        start = end + 1;
    }
    return folders;
}

std::wstring searchPathOf(const std::vector<std::filesystem::path>& folders) {
    std::wstring searchPath;
    for (const std::filesystem::path& folder : folders) {
        const std::optional<std::wstring> name = System::nameText(folder);
        if (name && isCarried(*name) && isSearchable(*name))
            searchPath += (searchPath.empty() ? L"" : L";") + *name;
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
    Candidate candidate{fullPath(file), {}, {}};
    if (const auto directory = System::nameText(candidate.path.parent_path()))
        candidate.directory = normalisePath(directory->c_str(), false);
    if (const auto name = System::nameText(candidate.path.filename()))
        candidate.fileName = normalisePath(name->c_str(), false);
    return candidate;
}

std::wstring displayName(const std::filesystem::path& path) {
    return System::displayName(path);
}

} // namespace Mz::Tools
