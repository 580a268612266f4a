/// Replaces a file such that a failure leaves the old file unchanged.
#pragma once

#include <filesystem>
#include <functional>
#include <iosfwd>

namespace Meshes {

/// Replaces the content of `file` by what `write` puts into the stream, whole or not at all.
///
/// `write` fills a temporary file in the same folder, which replaces `file` when its content has
/// reached the medium. A failure, a full disk or a crash before that leaves the old file unchanged;
/// only a crash leaves the temporary file (`NAME.saving-…`) in the folder. A symlink stays one, and
/// permissions are kept.
///
/// \throws QrStreamEx::ExWriteOpen with the reason of the system, if the folder takes no new file
/// or
///     `file` cannot be replaced
/// \throws QrStreamEx::ExWriteError if not everything could be written
/// \throws whatever `write` throws
void saveSafely(const std::filesystem::path& file, const std::function<void(std::ostream&)>& write);

} // namespace Meshes
