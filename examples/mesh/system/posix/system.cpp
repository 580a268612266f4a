/// Flushes the file before the rename and its folder after it: without the first the name may lead
/// to an empty file after a crash, without the second to the old one. The loaded libraries come
/// from the list of the dynamic loader.
#include "../system.h"

#include <cerrno>
#include <cstdio>

#include <fcntl.h>
#include <link.h>
#include <unistd.h>

namespace Meshes::system {

namespace {

std::error_code lastError() {
    return {errno, std::generic_category()};
}

/// Waits until the file, or the folder, has reached the medium.
std::error_code synchronise(const std::filesystem::path& path) {
    const int file = ::open(path.c_str(), O_RDONLY | O_CLOEXEC);
    if (file < 0)
        return lastError();
    const std::error_code result = ::fsync(file) == 0 ? std::error_code() : lastError();
    ::close(file);
    return result;
}

} // namespace

std::error_code createNew(const std::filesystem::path& path) {
    const int file = ::open(path.c_str(), O_WRONLY | O_CREAT | O_EXCL | O_CLOEXEC, 0666);
    if (file < 0)
        return lastError();
    ::close(file);
    return {};
}

std::error_code moveSafely(const std::filesystem::path& from, const std::filesystem::path& to) {
    if (const std::error_code failure = synchronise(from))
        return failure;
    if (::rename(from.c_str(), to.c_str()) != 0)
        return lastError();
    // The name is in the folder. Not every file system can flush one, so a failure is ignored.
    synchronise(to.has_parent_path() ? to.parent_path() : std::filesystem::path("."));
    return {};
}

std::size_t mappedLibraries(const std::filesystem::path& folder) {
    struct Search {
        const std::filesystem::path& folder;
        std::size_t found = 0;
    } search{folder};
    ::dl_iterate_phdr(
        [](dl_phdr_info* info, std::size_t, void* data) {
            Search& now = *static_cast<Search*>(data);
            const std::filesystem::path library(info->dlpi_name);
            std::error_code ignored;
            if (library.has_parent_path() &&
                std::filesystem::equivalent(library.parent_path(), now.folder, ignored))
                ++now.found;
            return 0;
        },
        &search);
    return search.found;
}

} // namespace Meshes::system
