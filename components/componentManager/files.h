// SPDX-License-Identifier: BSL-1.0
/// File operations for hosts and tools: safe replacement of a file, and full paths.
///
/// All functions may be called from any thread.
///
/// \since 0.2
#pragma once

#include "components/componentManager/export.h"

#include <filesystem>
#include <functional>
#include <iosfwd>
#include <optional>
#include <string_view>

namespace Mz {

/// Replaces the content of `file` by what `write` writes to the stream, completely or not at all.
///
/// `write` fills a new file in the same folder (`NAME.saving-` and a number). After that file has
/// reached the medium, it replaces `file` in one atomic step. Other programs see the old content or
/// the new one. After a failure, a full disk or a crash, the old file is unchanged. Only a crash
/// leaves the new file in the folder. When the function returns, the new content is on the medium;
/// on Linux the file's name is on the medium, too.
///
/// - A file that does not exist is created.
/// - A symlink stays a symlink: its target is replaced, or created if it does not exist.
/// - The permissions of the old file are kept. Other attributes and hard links are not.
/// - If several threads or programs replace one file concurrently, each replaces it completely and
///   the last one wins.
/// - Windows cannot replace a file while another program has it open. The function then retries for
///   half a second.
///
/// \param file  the file to replace
/// \param write  writes the new content to its argument, a binary stream that is valid during the
///     call only
/// \throws QrStreamEx::ExWriteOpen with the file's name and the system's reason, if `file`
///     exists and is not a regular file, if no new file can be created in its folder, or if `file`
///     cannot be replaced
/// \throws QrStreamEx::ExWriteError with the file's name, if the stream has failed when `write`
///     returns, or if the content cannot be written to the medium
/// \throws whatever `write` throws
MZ_COMPONENT_MANAGER_API void replaceFile(const std::filesystem::path& file,
                                          const std::function<void(std::ostream&)>& write);

/// Replaces the content of `file` by `content`, as the other overload does.
MZ_COMPONENT_MANAGER_API void replaceFile(const std::filesystem::path& file,
                                          std::string_view content);

/// Returns the folder of the running program's file, as a full path. On Linux the path contains no
/// symlinks.
///
/// The path comes from the system. The first argument of `main` is no substitute: it contains no
/// folder if the program was started by its bare name, and the parent process may set it to
/// anything.
///
/// \throws std::system_error if the system does not know it (on Linux, if /proc is not mounted)
MZ_COMPONENT_MANAGER_API std::filesystem::path programFolder();

/// Returns the path in an environment variable of this process; `std::nullopt` if the variable is
/// not set or empty. The path has all its characters, whatever the locale. No other thread may
/// change the environment meanwhile.
///
/// \param name  the variable's name, in ASCII
MZ_COMPONENT_MANAGER_API std::optional<std::filesystem::path> environmentPath(const char* name);

/// Returns `path` as a full path without "." and "..", without a separator at its end, and with the
/// system's preferred separators. Hosts pass folders to the component manager in this form.
///
/// The result names the same file as `path`. On Linux a symlink before a `..` is therefore resolved
/// first. Other symlinks stay. The path need not exist.
///
/// \throws std::filesystem::filesystem_error if `path` is relative and the current folder does
///     not exist any more
MZ_COMPONENT_MANAGER_API std::filesystem::path fullPath(const std::filesystem::path& path);

} // namespace Mz
