/// Writing a file such that nobody ever sees half of it.
#pragma once

#include "components/componentTools/export.h"

#include <filesystem>
#include <fstream>
#include <string_view>

namespace Mz::Tools {

/// Puts `content` in the place of the file: written under a name of its own first, then renamed. A
/// link stays one, and leads to the new file; the old file's permissions become those of the new
/// one. Throws `QrStreamEx::ExWriteOpen`, also for what is there and is no regular file, or
/// `QrStreamEx::ExWriteError`; the old file then stays.
MZ_COMPONENT_TOOLS_API void replaceFile(const std::filesystem::path& file,
                                        std::string_view content);

/// Opens a regular file that may be replaced at this very moment, for which some systems refuse it
/// for a while. False when there is none or it still cannot be opened.
bool openPatiently(std::ifstream& stream, const std::filesystem::path& file);

} // namespace Mz::Tools
