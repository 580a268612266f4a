// A listing names most files by kind and number, so their status is not asked for: that would take
// as long as all the rest. A symlink is asked for, since its own kind and number say nothing.
//
// The two sources need not agree. On an overlay file system, and where a file is mounted over
// another one, a listing gives other numbers than the status. A link to a file of the same search
// then looks like a file of its own. So where a link leads to something that no listing named, the
// status decides for every file of the search.
#include "components/platform/platform.h"

#include "components/platform/characters.h"
#include "components/platform/upperCase.h"

#include <algorithm>
#include <dirent.h>
#include <fcntl.h>
#include <memory>
#include <set>
#include <sys/stat.h>

namespace Mz::platform {

namespace {

struct CloseDirectory {
    void operator()(DIR* directory) const { ::closedir(directory); }
};

using Directory = std::unique_ptr<DIR, CloseDirectory>;

/// Where a file's identity comes from.
enum class Source { listing, status };

struct Listed {
    DirectoryEntry entry;
    Source source;
    std::u16string key; ///< to sort by
};

using Listing = std::vector<Listed>;

/// Whether an entry names the file by number; some file systems give a placeholder instead.
bool hasFileNumber(const dirent& entry) {
    constexpr ino_t placeholder = 0xFFFFFFFF;
    return entry.d_ino != 0 && entry.d_ino != placeholder && entry.d_ino != static_cast<ino_t>(-1);
}

/// The identity of a regular file, links followed, by its status.
std::optional<FileIdentity> identityByStatus(int directory, const char* name) {
    struct stat status;
    if (::fstatat(directory, name, &status, 0) != 0 || !S_ISREG(status.st_mode))
        return std::nullopt;
    return FileIdentity{status.st_dev, status.st_ino};
}

/// Adds the file that `item` names, if it is a candidate. The directory is on `device`.
void addCandidate(Listing& listing, const NativePath& path, DIR* directory, dev_t device,
                  const dirent& item) {
    if (item.d_name[0] == '.' || item.d_type == DT_DIR)
        return;
    const bool listed = item.d_type == DT_REG && hasFileNumber(item);
    const std::optional<FileIdentity> identity =
        listed ? FileIdentity{device, item.d_ino}
               : identityByStatus(::dirfd(directory), item.d_name);
    if (!identity)
        return;
    std::optional<std::wstring> name = toCharacters(item.d_name);
    if (!name)
        return;
    std::u16string key = sortKey(*name);
    listing.push_back({{std::move(*name), path + "/" + item.d_name, identity},
                       listed ? Source::listing : Source::status,
                       std::move(key)});
}

Listing list(const NativePath& path) {
    Listing listing;
    const Directory directory(::opendir(path.c_str()));
    struct stat own;
    if (!directory || ::fstat(::dirfd(directory.get()), &own) != 0)
        return listing;
    while (const dirent* item = ::readdir(directory.get()))
        addCandidate(listing, path, directory.get(), own.st_dev, *item);
    return listing;
}

/// Whether a link leads to a file that no listing named.
bool isOneUnnamed(const std::vector<Listing>& listings) {
    std::set<FileIdentity> linked;
    for (const Listing& listing : listings)
        for (const Listed& file : listing)
            if (file.source == Source::status)
                linked.insert(*file.entry.identity);
    if (linked.empty())
        return false;
    for (const Listing& listing : listings)
        for (const Listed& file : listing)
            if (file.source == Source::listing)
                linked.erase(*file.entry.identity);
    return !linked.empty();
}

void identifyByStatus(Listing& listing) {
    for (Listed& file : listing)
        if (file.source == Source::listing)
            if (const auto identity = identityByStatus(AT_FDCWD, file.entry.path.c_str()))
                file.entry.identity = identity;
}

/// Sorts as a file system without letter case does; names with one key by their bytes.
std::vector<DirectoryEntry> sorted(Listing listing) {
    std::vector<Listed*> order;
    order.reserve(listing.size());
    for (Listed& file : listing)
        order.push_back(&file);
    std::sort(order.begin(), order.end(), [](const Listed* a, const Listed* b) {
        const int difference = a->key.compare(b->key);
        return difference ? difference < 0 : a->entry.path < b->entry.path;
    });
    std::vector<DirectoryEntry> entries;
    entries.reserve(order.size());
    for (Listed* file : order)
        entries.push_back(std::move(file->entry));
    return entries;
}

} // namespace

std::vector<std::vector<DirectoryEntry>>
listCandidates(const std::vector<NativePath>& directories) {
    std::vector<Listing> listings;
    listings.reserve(directories.size());
    for (const NativePath& directory : directories)
        listings.push_back(list(directory));
    if (isOneUnnamed(listings))
        for (Listing& listing : listings)
            identifyByStatus(listing);
    std::vector<std::vector<DirectoryEntry>> entries;
    entries.reserve(listings.size());
    for (Listing& listing : listings)
        entries.push_back(sorted(std::move(listing)));
    return entries;
}

} // namespace Mz::platform
