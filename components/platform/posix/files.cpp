// SPDX-License-Identifier: BSL-1.0
/// The file functions for Linux.
///
/// A rename is atomic here. `fsync` of the file brings its content to the medium, and `fsync` of
/// its folder brings its name there.
#include "components/platform/files.h"

#include "components/platform/characters.h"

#include <cerrno>
#include <cstdio>
#include <cstdlib>
#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>
#include <utility>

namespace Mz::platform {

namespace {

std::error_code lastError() {
    return {errno, std::generic_category()};
}

} // namespace

std::error_code createNew(const std::filesystem::path& path, std::filesystem::perms permissions) {
    const int file = ::open(path.c_str(), O_WRONLY | O_CREAT | O_EXCL | O_CLOEXEC,
                            static_cast<mode_t>(permissions));
    if (file < 0)
        return lastError();
    ::close(file);
    return {};
}

std::error_code syncFile(const std::filesystem::path& path,
                         std::optional<std::filesystem::perms> permissions) {
    const int file = ::open(path.c_str(), O_RDONLY | O_CLOEXEC);
    if (file < 0)
        return lastError();
    if (permissions)
        static_cast<void>(::fchmod(file, static_cast<mode_t>(*permissions)));
    const std::error_code result = ::fsync(file) == 0 ? std::error_code() : lastError();
    ::close(file);
    return result;
}

std::error_code moveOver(const std::filesystem::path& from, const std::filesystem::path& to) {
    // What may throw comes first, for a caller relies on the old file after an exception.
    const std::filesystem::path folder =
        to.has_parent_path() ? to.parent_path() : std::filesystem::path(".");
    if (std::rename(from.c_str(), to.c_str()) != 0)
        return lastError();
    // Failures are ignored: some file systems cannot sync a folder, and the file is renamed
    // already.
    syncFile(folder, std::nullopt);
    return {};
}

std::optional<std::filesystem::path> symlinkTarget(const std::filesystem::path& path,
                                                   std::error_code& failure) {
    std::filesystem::path text = std::filesystem::read_symlink(path, failure);
    if (!failure)
        return text;
    if (failure == std::errc::invalid_argument || failure == std::errc::no_such_file_or_directory ||
        failure == std::errc::not_a_directory)
        failure.clear();
    return std::nullopt;
}

std::wstring errorText(const std::error_code& error) {
    return toCharacters(error.message()).value_or(L"error " + std::to_wstring(error.value()));
}

std::filesystem::path programFile() {
    std::error_code failure;
    std::filesystem::path file = std::filesystem::read_symlink("/proc/self/exe", failure);
    if (failure)
        throw std::system_error(failure, "the program's file");
    return file;
}

std::optional<std::filesystem::path> environmentPath(const char* name) {
    const char* const value = std::getenv(name);
    return value && *value ? std::optional<std::filesystem::path>(value) : std::nullopt;
}

std::filesystem::path resolveDots(const std::filesystem::path& path) {
    std::filesystem::path plain;
    for (const std::filesystem::path& part : path) {
        if (part == "..") {
            std::error_code failure;
            if (std::filesystem::is_symlink(std::filesystem::symlink_status(plain, failure))) {
                std::filesystem::path followed = std::filesystem::weakly_canonical(plain, failure);
                if (!failure)
                    plain = std::move(followed);
            }
            plain = plain.parent_path();
        } else if (part != ".") {
            plain /= part;
        }
    }
    return plain.lexically_normal(); // Removes repeated separators.
}

} // namespace Mz::platform
