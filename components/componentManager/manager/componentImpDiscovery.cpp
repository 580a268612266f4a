// SPDX-License-Identifier: BSL-1.0
/// Lists the candidates of a search path, and merges them with the restored records.
///
/// All directories are listed in one call, so that a file with several names gets one record. The
/// normalised names identify a record; a candidate is opened by the names in which it was found,
/// where letter case matters. The merge keeps the restored record and discards the new one, because
/// builder records point to their library record.
#include "components/componentManager/manager/componentImpPrivate.h"
#include "components/componentManager/nativeText.h"

#include "components/platform/pathNormaliser.h"
#include "components/platform/searchPath.h"

#include <algorithm>
#include <cstddef>
#include <functional>
#include <iterator>
#include <list>
#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

namespace Mz {

namespace {

/// Returns the directory part of the program's name on the command line, which is empty if the name
/// has none; `std::nullopt` if the system does not know the command line. The current directory is
/// no substitute in that case: whatever libraries it contains would be loaded.
std::optional<std::wstring> programDirectory() {
    const std::optional<std::wstring> program = platform::firstArgument();
    if (!program)
        return std::nullopt;
    const std::size_t separator = program->find_last_of(L"/\\");
    if (separator == std::wstring::npos)
        return std::wstring();
    // The separator of a root is part of its name.
    return program->substr(0, std::max<std::size_t>(separator, 1));
}

/// Returns the directories to search, as the caller spells them.
std::vector<std::wstring> directoriesOf(const wchar_t* searchPath) {
    std::vector<std::wstring> directories;
    std::wstring_view rest(textOrEmpty(searchPath));
    while (true) {
        const std::wstring_view directory = platform::takeDirectory(rest);
        if (directory.empty())
            break;
        directories.emplace_back(directory);
    }
    if (directories.empty())
        if (std::optional<std::wstring> directory = programDirectory())
            directories.push_back(std::move(*directory));
    return directories;
}

struct IdentityHash {
    std::size_t operator()(const platform::FileIdentity& identity) const {
        return static_cast<std::size_t>(identity.index ^ identity.device << 40);
    }
};

/// The files that have a record, for systems where one file can have several names.
class SeenFiles {
  public:
    bool contains(const platform::DirectoryEntry& entry) {
        const platform::NativePath* const* const other = files.find(*entry.identity);
        return other && platform::isSameFile(**other, entry.path);
    }
    /// `path` must outlive this object.
    void add(const platform::FileIdentity& identity, const platform::NativePath& path) {
        if (const auto [place, isNew] = files.insert(identity); isNew)
            *place = &path;
    }

  private:
    HashMap<platform::FileIdentity, const platform::NativePath*, IdentityHash> files;
};

/// Returns `directory` as the system spells it, "." if it is empty.
std::optional<platform::NativePath> nativeDirectory(const std::wstring& directory) {
    return platform::toNative(directory.empty() ? std::wstring_view(L".") : directory);
}

using LibraryList = ComponentManager::LibraryList;
using LibraryKey = ComponentManager::LibraryKey;

/// Groups of new records with the same names. These occur where letter case distinguishes files. If
/// there are as many restored records with these names, the first one belongs to the first file,
/// the second one to the second file, and so on.
class SameNameGroups {
  public:
    /// Requires that the `restoredCount` of each record in `byName` is set.
    SameNameGroups(LibraryList& found, ComponentManager::LibraryMap& byName) {
        if (found.size() == byName.size())
            return;
        for (auto file = found.begin(); file != found.end(); ++file) {
            const LibraryKey key(file->directory, file->fileName);
            const LibraryList::iterator first = *byName.find(key);
            if (first == file)
                continue;
            Group& group = groups[key];
            group.restoredCount = first->restoredCount;
            group.others.push_back(file);
        }
    }

    /// Returns whether it is unknown which restored record belongs to which file, because their
    /// numbers differ. `file` is the next new record of the name. Where letter case does not
    /// distinguish files, two restored records of one name are about one file, and the later one
    /// replaces the earlier one.
    bool isAmbiguous(const LibraryKey& key, const ComponentLibrary& file) const {
        if (platform::namesIgnoreCase())
            return false;
        const Group* const group = groups.find(key);
        return group ? group->restoredCount != group->others.size() + 1 : file.restoredCount > 1;
    }

    /// Replaces `file`, the previous new record of this name, by the next one.
    void advance(const LibraryKey& key, LibraryList::iterator& file) {
        Group* const group = groups.find(key);
        if (group && group->used++ > 0)
            file = group->others[group->used - 2];
    }

  private:
    struct Group {
        std::size_t restoredCount = 0;
        std::vector<LibraryList::iterator> others; ///< all but the first
        std::size_t used = 0;                      ///< how many have met their restored record
    };
    HashMap<LibraryKey, Group, ComponentManager::LibraryKeyHash> groups;
};

} // namespace

std::size_t ComponentManager::LibraryKeyHash::operator()(const LibraryKey& key) const {
    const std::hash<std::wstring_view> hash;
    return hash(key.first) ^ hash(key.second);
}

std::wstring ComponentManager::normalisePath(const wchar_t* path, bool listMode) {
    return Mz::normalisePath(path, listMode);
}

void ComponentManager::discover(const wchar_t* searchPath, LibraryList& newList, LibraryMap& byName,
                                std::vector<std::wstring>& unlisted) {
    std::vector<SharedText> directories; // normalised
    std::vector<platform::NativePath> openingPaths;
    for (const std::wstring& entry : directoriesOf(searchPath)) {
        const std::optional<platform::NativePath> native = nativeDirectory(entry);
        if (!native)
            continue;
        directories.emplace_back(normalisePath(entry.c_str(), false));
        openingPaths.push_back(platform::openingPath(directories.back(), {}, *native));
    }
    SeenFiles seen;
    std::vector<bool> incomplete;
    std::vector<std::vector<platform::DirectoryEntry>> listings =
        platform::listCandidates(openingPaths, &incomplete);
    for (std::size_t index = 0; index < listings.size(); ++index) {
        if (incomplete[index])
            unlisted.emplace_back(directories[index].view());
        byName.reserve(byName.size() + listings[index].size());
        for (platform::DirectoryEntry& candidate : listings[index]) {
            const std::wstring fileName = normaliseName(std::move(candidate.name));
            // Each file gets one record, even if the search path leads to it several times.
            if (candidate.identity ? seen.contains(candidate)
                                   : byName.find({directories[index], fileName}) != nullptr)
                continue;
            ComponentLibrary& library = newList.emplace_back(*this);
            library.directory = directories[index];
            library.fileName = fileName;
            library.foundPath = std::move(candidate.path);
            if (candidate.identity)
                seen.add(*candidate.identity, library.foundPath);
            if (const auto [place, isNew] = byName.insert({library.directory, library.fileName});
                isNew)
                *place = std::prev(newList.end());
        }
    }
}

void ComponentManager::keepUnlisted(LibraryList& found, const std::vector<std::wstring>& unlisted) {
    for (auto next = libraries.begin(); next != libraries.end();) {
        const auto old = next++;
        if (std::find(unlisted.begin(), unlisted.end(), old->directory) != unlisted.end())
            found.splice(found.end(), libraries, old);
    }
}

void ComponentManager::merge(LibraryList& found, LibraryMap& byName) {
    // Whatever allocates comes first: if it throws, no restored record has moved.
    std::vector<LibraryList::iterator*> places; // In the map; null if the file is gone.
    places.reserve(libraries.size());
    for (const ComponentLibrary& library : libraries) {
        places.push_back(byName.find({library.directory, library.fileName}));
        if (places.back())
            ++(*places.back())->restoredCount;
    }
    SameNameGroups groups(found, byName);
    LibraryList replaced; // Kept alive because the keys of both maps are views into these records.
    auto place = places.begin();
    for (auto next = libraries.begin(); next != libraries.end();) {
        const auto old = next++;
        LibraryList::iterator* const file = *place++;
        const LibraryKey key(old->directory, old->fileName);
        if (!file || groups.isAmbiguous(key, **file))
            continue;
        groups.advance(key, *file);
        old->foundPath = std::move((*file)->foundPath);
        found.splice(*file, libraries, old);
        replaced.splice(replaced.end(), found, *file);
        *file = old;
    }
}

} // namespace Mz
