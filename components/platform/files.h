/// What it takes of the system to replace a file safely and to name files fully: one description,
/// and one implementation for each system, as with `platform.h`.
///
/// All functions may be called from any thread and throw nothing but `std::bad_alloc`, where
/// nothing else is said.
#pragma once

#include <filesystem>
#include <optional>
#include <string>
#include <system_error>

namespace Mz::platform {

/// Creates an empty file with these permissions, as far as the system knows them and the process
/// may give them; `std::errc::file_exists` if there is a file of that name.
std::error_code createNew(const std::filesystem::path& file, std::filesystem::perms permissions);

/// Gives the file these permissions, unless there are none or the process may not, and waits until
/// the file is on the medium.
std::error_code complete(const std::filesystem::path& file,
                         std::optional<std::filesystem::perms> permissions);

/// Gives the file `from` the name `to`, in one step and in place of a file of that name, and waits
/// until the name is on the medium, where the system can. A file that others have open may make
/// this wait for half a second.
std::error_code moveOver(const std::filesystem::path& from, const std::filesystem::path& to);

/// The text of a symlink; nothing if `path` is none.
std::optional<std::filesystem::path> linkText(const std::filesystem::path& path);

/// The system's words for an error.
std::wstring errorText(const std::error_code& error);

/// The file of the running program.
///
/// \throws std::system_error if the system does not know it
std::filesystem::path programFile();

/// `path`, which is absolute, without `.` and `..`, leading to where the system goes.
std::filesystem::path resolveDots(const std::filesystem::path& path);

} // namespace Mz::platform
