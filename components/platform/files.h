// SPDX-License-Identifier: BSL-1.0
/// The system functions for replacing a file safely and for full paths. Each system has its own
/// implementation, as with `platform.h`.
///
/// All functions may be called from any thread. They throw `std::bad_alloc` only, unless their
/// comment says otherwise. A function that returns an error code returns an empty one for success.
#pragma once

#include <filesystem>
#include <optional>
#include <string>
#include <system_error>

namespace Mz::platform {

/// Creates an empty file with `permissions`, as far as the system supports them and the process may
/// set them.
///
/// \return `std::errc::file_exists` if a file of that name exists
std::error_code createNew(const std::filesystem::path& file, std::filesystem::perms permissions);

/// Sets the permissions of the file, if there are any and the process may set them, and waits until
/// the file is on the medium.
std::error_code syncFile(const std::filesystem::path& file,
                         std::optional<std::filesystem::perms> permissions);

/// Renames the file `from` to `to` in one atomic step, and replaces a file of that name. Then waits
/// until the name is on the medium, where the system supports that. If other programs have the old
/// file open, the function may retry for half a second.
std::error_code moveOver(const std::filesystem::path& from, const std::filesystem::path& to);

/// Returns the target of a symlink, as it is stored; `std::nullopt` if `path` is not a symlink or
/// does not exist, and after a failure.
/// \param failure  whether it is unknown if `path` is a symlink, and why
std::optional<std::filesystem::path> symlinkTarget(const std::filesystem::path& path,
                                                   std::error_code& failure);

/// Returns the system's message for an error.
std::wstring errorText(const std::error_code& error);

/// Returns the file of the running program.
///
/// \throws std::system_error if the system does not know it
std::filesystem::path programFile();

/// Returns the path in an environment variable; `std::nullopt` if it is not set or empty.
std::optional<std::filesystem::path> environmentPath(const char* name);

/// Returns `path`, which must be absolute, without `.` and `..`. The result names the same file.
std::filesystem::path resolveDots(const std::filesystem::path& path);

} // namespace Mz::platform
