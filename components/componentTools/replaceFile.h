/// Writing a file such that nobody ever sees half of it.
#pragma once

#include <filesystem>
#include <string_view>

namespace Mz::Tools {

/// Puts `content` in the place of the file: written under a name of its own first, then renamed.
/// Throws `QrStreamEx::ExWriteOpen` or `QrStreamEx::ExWriteError`; the old file then stays.
void replaceFile(const std::filesystem::path& file, std::string_view content);

} // namespace Mz::Tools
