#include "components/componentManager/manager/componentImpPrivate.h"

#include "components/platform/pathNormaliser.h"

#include <functional>
#include <iterator>
#include <string_view>

namespace Mz {

namespace {

/// The directory in which the program that was started stands, as its command line tells it.
/// Nothing when that cannot be told: the current one instead would run whatever lies there.
std::optional<std::wstring> programDirectory() {
    const std::optional<std::wstring> program = platform::firstArgument();
    if (!program)
        return std::nullopt;
    const std::size_t separator = program->find_last_of(L"/\\");
    if (separator == std::wstring::npos)
        return std::wstring();
    // A root is nothing without its separator.
    return program->substr(0, std::max<std::size_t>(separator, 1));
}

/// The directories to search, as the caller spells them.
std::vector<std::wstring> directoriesOf(const wchar_t* searchPath) {
    std::vector<std::wstring> directories;
    std::wstring_view rest(searchPath ? searchPath : L"");
    while (true) {
        rest.remove_prefix(std::min(rest.find_first_not_of(L';'), rest.size()));
        if (rest.empty())
            break;
        const std::wstring_view directory = rest.substr(0, rest.find(L';'));
        directories.emplace_back(directory);
        rest.remove_prefix(directory.size());
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

/// The files that have a record, on a system where one file can have several names.
class SeenFiles {
  public:
    bool contains(const platform::DirectoryEntry& entry) {
        const platform::NativePath* const* const other = files.find(*entry.identity);
        return other && platform::isSameFile(**other, entry.path);
    }
    /// `path` must outlive this object.
    void add(const platform::FileIdentity& identity, const platform::NativePath& path) {
        if (!files.find(identity))
            files[identity] = &path;
    }

  private:
    HashMap<platform::FileIdentity, const platform::NativePath*, IdentityHash> files;
};

/// `directory` as the system wants it, where an empty name is the current one.
std::optional<platform::NativePath> nativeDirectory(const std::wstring& directory) {
    return platform::toNative(directory.empty() ? std::wstring_view(L".") : directory);
}

using LibraryList = ComponentManager::LibraryList;
using LibraryKey = ComponentManager::LibraryKey;

/// Several files whose records have the same names, as where letter case tells files apart. Of what
/// was recorded of them the first record belongs to the first file, and so on, if there are as
/// many.
class Namesakes {
  public:
    /// The claims of the recorded libraries must have been counted.
    Namesakes(LibraryList& found, ComponentManager::LibraryMap& byName) {
        if (found.size() == byName.size())
            return;
        for (auto file = found.begin(); file != found.end(); ++file) {
            const LibraryKey key(file->directory, file->fileName);
            const LibraryList::iterator first = *byName.find(key);
            if (first == file)
                continue;
            Group& group = groups[key];
            group.claims = first->claims;
            group.others.push_back(file);
        }
    }

    /// Returns whether it is unknown which record belongs to which file: there are more records, or
    /// fewer. `file` is the one that is next. Where letter case tells no files apart, two records
    /// of one name are of one file, and the later replaces the earlier.
    bool areConfused(const LibraryKey& key, const ComponentLibrary& file) const {
        if (platform::namesIgnoreCase())
            return false;
        const Group* const group = groups.find(key);
        return group ? group->claims != group->others.size() + 1 : file.claims > 1;
    }

    /// Makes `file`, the one of this name whose turn it was last, the one whose turn it is.
    void moveOn(const LibraryKey& key, LibraryList::iterator& file) {
        Group* const group = groups.find(key);
        if (group && group->turn++ > 0)
            file = group->others[group->turn - 2];
    }

  private:
    struct Group {
        std::size_t claims = 0;
        std::vector<LibraryList::iterator> others; ///< all but the first
        std::size_t turn = 0;
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

void ComponentManager::discover(const wchar_t* searchPath, LibraryList& newList,
                                LibraryMap& byName) {
    std::vector<std::wstring> directories; // normalised
    std::vector<platform::NativePath> opened;
    for (const std::wstring& entry : directoriesOf(searchPath)) {
        const std::optional<platform::NativePath> native = nativeDirectory(entry);
        if (!native)
            continue;
        directories.push_back(normalisePath(entry.c_str(), false));
        opened.push_back(platform::openingPath(directories.back(), {}, *native));
    }
    SeenFiles seen;
    std::vector<std::vector<platform::DirectoryEntry>> listings = platform::listCandidates(opened);
    for (std::size_t index = 0; index < listings.size(); ++index)
        for (platform::DirectoryEntry& candidate : listings[index]) {
            std::wstring fileName = normalisePath(candidate.name.c_str(), false);
            // One file, one record, however often the search path leads to it.
            if (candidate.identity ? seen.contains(candidate)
                                   : byName.find({directories[index], fileName}) != nullptr)
                continue;
            ComponentLibrary& library = newList.emplace_back(*this);
            library.directory = directories[index];
            library.fileName = std::move(fileName);
            library.foundPath = std::move(candidate.path);
            if (candidate.identity)
                seen.add(*candidate.identity, library.foundPath);
            const LibraryKey key(library.directory, library.fileName);
            if (!byName.find(key))
                byName[key] = std::prev(newList.end());
        }
}

void ComponentManager::merge(LibraryList& recorded, LibraryMap& byName) {
    std::vector<LibraryList::iterator*> places; // in the map; null where the file is gone
    places.reserve(recorded.size());
    for (const ComponentLibrary& library : recorded) {
        places.push_back(byName.find({library.directory, library.fileName}));
        if (places.back())
            ++(*places.back())->claims;
    }
    Namesakes namesakes(libraries, byName);
    LibraryList replaced; // The maps' keys point into them.
    auto place = places.begin();
    for (auto next = recorded.begin(); next != recorded.end();) {
        const auto old = next++;
        LibraryList::iterator* const found = *place++;
        const LibraryKey key(old->directory, old->fileName);
        if (!found || namesakes.areConfused(key, **found))
            continue;
        namesakes.moveOn(key, *found);
        old->foundPath = std::move((*found)->foundPath);
        libraries.splice(*found, recorded, old);
        replaced.splice(replaced.end(), libraries, *found);
        *found = old;
    }
}

} // namespace Mz
