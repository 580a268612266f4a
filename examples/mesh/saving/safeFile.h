/// Saving such that nothing is lost when saving fails.
#pragma once

#include <filesystem>
#include <functional>
#include <iosfwd>

namespace Meshes {

/// Has `write` fill the file `file`, whole or not at all: what it writes goes to a temporary file
/// in the same folder, which takes the place of `file` when everything stands on the medium. Until
/// then, through failures, full disks and crashes, the old file stays as it is; only a crash leaves
/// the temporary file behind (`NAME.saving-…`). A symbolic link stays one, and permissions are
/// kept.
///
/// Raises `QrStreamEx::ExWriteOpen`, with the system's reason, when the folder takes no new file or
/// `file` cannot be replaced, `QrStreamEx::ExWriteError` when not everything could be written, and
/// what `write` throws.
void saveSafely(const std::filesystem::path& file, const std::function<void(std::ostream&)>& write);

} // namespace Meshes
