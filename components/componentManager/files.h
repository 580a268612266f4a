/// What hosts and tools do with files: replacing one safely, and naming folders fully.
///
/// All functions may be called from any thread.
#pragma once

#include "components/componentManager/export.h"

#include <filesystem>
#include <functional>
#include <iosfwd>
#include <string_view>

namespace Mz {

/// Replaces the content of `file` by what `write` puts into the stream, whole or not at all.
///
/// `write` fills a new file in the same folder (`NAME.saving-` and a number). When that file has
/// reached the medium, it takes the place of `file` in one step: other programs see the old content
/// or the new one, and after a failure, a full disk or a crash the old file is as it was. Only a
/// crash leaves the new file behind. When the function returns, the new content is on the medium;
/// on Linux, so is its name in the folder.
///
/// - A file that does not exist is created.
/// - A symlink stays one: the file to which it leads is replaced, or created if it is not there.
/// - The permissions of an old file are kept. Other attributes and hard links are not.
/// - If several threads or programs replace one file at once, each replaces it whole and the last
///   one wins.
/// - Windows cannot replace a file while another program has it open. The function then retries for
///   half a second.
///
/// The stream is binary and belongs to the call.
///
/// \throws QrStreamEx::ExWriteOpen with the file's name and the system's reason, if `file` is a
///     folder or no regular file, if its folder takes no new file, or if `file` cannot be replaced
/// \throws QrStreamEx::ExWriteError with the file's name, if the stream has failed when `write`
///     returns, or if not everything reached the medium
/// \throws whatever `write` throws
MZ_COMPONENT_MANAGER_API void replaceFile(const std::filesystem::path& file,
                                          const std::function<void(std::ostream&)>& write);

/// Replaces the content of `file` by `content`, as the other overload does.
MZ_COMPONENT_MANAGER_API void replaceFile(const std::filesystem::path& file,
                                          std::string_view content);

/// Returns the folder of the running program's file, as a full path without symlinks.
///
/// The system is asked for it. The first argument of `main` is no substitute: a program that is
/// started by its bare name gets no folder there, and others may put anything into it.
///
/// \throws std::system_error if the system does not know it (on Linux, if /proc is not mounted)
MZ_COMPONENT_MANAGER_API std::filesystem::path programFolder();

/// Returns `path` as a full path without `.` and `..`, without a separator at its end, and with the
/// system's own separators: the form in which hosts name folders to the component manager.
///
/// The path leads to where the system goes. On Linux a symlink is followed before a `..` behind it
/// goes up; other symlinks stay, and the path need not exist.
///
/// \throws std::filesystem::filesystem_error if `path` is relative and the current folder is gone
MZ_COMPONENT_MANAGER_API std::filesystem::path fullPath(const std::filesystem::path& path);

} // namespace Mz
