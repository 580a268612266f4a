#include "components/componentManager/componentImpPrivate.h"

#include "components/componentManager/pathNormaliser.h"

#include <functional>
#include <iterator>
#include <string_view>

namespace Mz {

namespace {

/// The directory in which the program that was started stands, as its command line tells it.
std::wstring programDirectory() {
    const std::wstring program = platform::firstArgument();
    const std::size_t separator = program.find_last_of(L"/\\");
    if (separator == std::wstring::npos)
        return {};
    // A root is nothing without its separator.
    const bool isRoot = separator == 0 || (separator == 2 && program[1] == L':');
    return program.substr(0, separator + (isRoot ? 1 : 0));
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
        directories.push_back(programDirectory());
    return directories;
}

struct IdentityHash {
    std::size_t operator()(const platform::FileIdentity& identity) const {
        return static_cast<std::size_t>(identity.index ^ identity.device << 40);
    }
};

/// `directory` as the system wants it, where an empty name is the current one.
std::optional<platform::NativePath> nativeDirectory(const std::wstring& directory) {
    return platform::toNative(directory.empty() ? std::wstring_view(L".") : directory);
}

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
    HashMap<platform::FileIdentity, const platform::NativePath*, IdentityHash> seen;
    for (const std::wstring& entry : directoriesOf(searchPath)) {
        const std::wstring directory = normalisePath(entry.c_str(), false);
        const std::optional<platform::NativePath> native = nativeDirectory(entry);
        if (!native)
            continue;
        for (platform::DirectoryEntry& candidate :
             platform::listCandidates(platform::openingPath(directory, {}, *native))) {
            std::wstring fileName = normalisePath(candidate.name.c_str(), false);
            // One file, one record, however often the search path leads to it.
            if (candidate.identity) {
                const platform::NativePath* const* const other = seen.find(*candidate.identity);
                if (other && platform::isSameFile(**other, candidate.path))
                    continue;
            } else if (byName.find({directory, fileName})) {
                continue;
            }
            ComponentLibrary& library = newList.emplace_back(*this);
            library.directory = directory;
            library.fileName = std::move(fileName);
            library.foundPath = std::move(candidate.path);
            if (candidate.identity && !seen.find(*candidate.identity))
                seen[*candidate.identity] = &library.foundPath;
            const LibraryKey key(library.directory, library.fileName);
            if (!byName.find(key))
                byName[key] = std::prev(newList.end());
        }
    }
}

void ComponentManager::merge(LibraryList& recorded, LibraryMap& byName) {
    LibraryList replaced; // The map's keys stand in them.
    for (auto next = recorded.begin(); next != recorded.end();) {
        const auto old = next++;
        LibraryList::iterator* found = byName.find({old->directory, old->fileName});
        if (!found)
            continue;
        old->foundPath = (*found)->foundPath;
        libraries.splice(*found, recorded, old);
        replaced.splice(replaced.end(), libraries, *found);
        *found = old;
    }
}

} // namespace Mz
