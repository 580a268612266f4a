// SPDX-License-Identifier: BSL-1.0
/// Lists the candidates of directories.
///
/// A listing contains the kind and number of most files, so their status is not queried: that would
/// take as long as everything else. A symlink is queried, because its own kind and number do not
/// identify its target.
///
/// Listing and status need not agree. On an overlay file system, and where a file is mounted over
/// another one, a listing contains other numbers than the status. A symlink to a file of the same
/// search then looks like a separate file. So if a symlink leads to a file that no listing
/// contains, the status identifies all files of the search.
#include "components/platform/platform.h"

#include "components/platform/characters.h"
#include "components/platform/posix/temporaryErrors.h"
#include "components/platform/upperCase.h"

#include <algorithm>
#include <cerrno>
#include <cstddef>
#include <dirent.h>
#include <fcntl.h>
#include <memory>
#include <optional>
#include <set>
#include <string>
#include <string_view>
#include <sys/stat.h>
#include <utility>
#include <vector>

namespace Mz::platform {

namespace {

struct CloseDirectory {
    void operator()(DIR* directory) const { ::closedir(directory); }
};

using Directory = std::unique_ptr<DIR, CloseDirectory>;

/// The candidates of a directory.
struct Listing {
    std::vector<DirectoryEntry> files;
    std::vector<bool> byStatus; ///< which of them were identified by their status
    bool incomplete = false;    ///< candidates may be missing, by a temporary failure
};

/// Returns whether an entry contains the number of its file. Some file systems use a placeholder.
bool hasFileNumber(const dirent& entry) {
    constexpr ino_t placeholder = 0xFFFFFFFF;
    return entry.d_ino != 0 && entry.d_ino != placeholder && entry.d_ino != static_cast<ino_t>(-1);
}

/// Returns the identity of a regular file, or of the one to which a symlink leads, from its status.
std::optional<FileIdentity> identityByStatus(int directory, const char* name) {
    struct stat status;
    if (::fstatat(directory, name, &status, 0) != 0 || !S_ISREG(status.st_mode))
        return std::nullopt;
    return FileIdentity{status.st_dev, status.st_ino};
}

/// Notes a failure of the last call, whose error number is in `errno`.
void noteFailure(Listing& listing) {
    listing.incomplete = listing.incomplete || isTemporary(errno);
}

/// Returns the path of a file, in one allocation.
NativePath pathOf(const NativePath& directory, std::string_view name) {
    NativePath path;
    path.reserve(directory.size() + 1 + name.size());
    return path.append(directory).append(1, '/').append(name);
}

/// Adds the file of `item` if it is a candidate. `device` is the device of the directory.
void addCandidate(Listing& listing, const NativePath& path, DIR* directory, dev_t device,
                  const dirent& item) {
    if (item.d_name[0] == '.' || item.d_type == DT_DIR)
        return;
    const bool listed = item.d_type == DT_REG && hasFileNumber(item);
    errno = 0;
    const std::optional<FileIdentity> identity =
        listed ? FileIdentity{device, item.d_ino}
               : identityByStatus(::dirfd(directory), item.d_name);
    if (!identity)
        return noteFailure(listing);
    std::optional<std::wstring> name = toCharacters(item.d_name);
    if (!name)
        return;
    listing.files.push_back({std::move(*name), pathOf(path, item.d_name), identity});
    listing.byStatus.push_back(!listed);
}

/// Returns null at the end of the directory, where `errno` is zero, and after a failure.
const dirent* nextEntry(DIR* directory) {
    errno = 0;
    return ::readdir(directory);
}

Listing list(const NativePath& path) {
    Listing listing;
    const Directory directory(::opendir(path.c_str()));
    struct stat status;
    if (!directory || ::fstat(::dirfd(directory.get()), &status) != 0) {
        noteFailure(listing);
        return listing;
    }
    while (const dirent* item = nextEntry(directory.get()))
        addCandidate(listing, path, directory.get(), status.st_dev, *item);
    noteFailure(listing);
    return listing;
}

/// Returns whether a file that was identified by its status, such as the target of a symlink, is in
/// no listing.
bool hasUnlistedTarget(const std::vector<Listing>& listings) {
    std::set<FileIdentity> targets;
    for (const Listing& listing : listings)
        for (std::size_t index = 0; index < listing.files.size(); ++index)
            if (listing.byStatus[index])
                targets.insert(*listing.files[index].identity);
    if (targets.empty())
        return false;
    for (const Listing& listing : listings)
        for (std::size_t index = 0; index < listing.files.size(); ++index)
            if (!listing.byStatus[index])
                targets.erase(*listing.files[index].identity);
    return !targets.empty();
}

void identifyByStatus(Listing& listing) {
    for (std::size_t index = 0; index < listing.files.size(); ++index)
        if (!listing.byStatus[index])
            if (const auto identity = identityByStatus(AT_FDCWD, listing.files[index].path.c_str()))
                listing.files[index].identity = identity;
}

/// The sort key of a file, and the place of the file before it was sorted.
struct Place {
    std::string key;
    std::size_t index;
};

/// Moves each file to its place: `places[0]` has the index of the file that comes first. It follows
/// each cycle, so that it needs no second array; pages that are new cost as much as the sorting.
void arrange(std::vector<DirectoryEntry>& files, std::vector<Place>& places) {
    for (std::size_t first = 0; first < places.size(); ++first) {
        std::size_t at = first;
        while (places[at].index != first) {
            const std::size_t from = std::exchange(places[at].index, at);
            std::swap(files[at], files[from]);
            at = from;
        }
        places[at].index = at;
    }
}

/// Sorts by key; files with equal keys by the bytes of their paths.
void sort(std::vector<DirectoryEntry>& files) {
    std::vector<Place> places;
    places.reserve(files.size());
    for (const DirectoryEntry& file : files)
        places.push_back({sortKey(file.name), places.size()});
    std::sort(places.begin(), places.end(), [&](const Place& a, const Place& b) {
        const int difference = a.key.compare(b.key);
        return difference ? difference < 0 : files[a.index].path < files[b.index].path;
    });
    arrange(files, places);
}

} // namespace

std::vector<std::vector<DirectoryEntry>> listCandidates(const std::vector<NativePath>& directories,
                                                        std::vector<bool>* unlisted) {
    std::vector<Listing> listings;
    listings.reserve(directories.size());
    for (const NativePath& directory : directories)
        listings.push_back(list(directory));
    if (unlisted) {
        unlisted->clear();
        for (const Listing& listing : listings)
            unlisted->push_back(listing.incomplete);
    }
    if (hasUnlistedTarget(listings))
        for (Listing& listing : listings)
            identifyByStatus(listing);
    std::vector<std::vector<DirectoryEntry>> entries;
    entries.reserve(listings.size());
    for (Listing& listing : listings) {
        sort(listing.files);
        entries.push_back(std::move(listing.files));
    }
    return entries;
}

} // namespace Mz::platform
