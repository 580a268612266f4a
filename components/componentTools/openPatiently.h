/// Opening a file that other programs replace.
#pragma once

#include <filesystem>
#include <fstream>

namespace Mz::Tools {

/// Opens a regular file that may be replaced at this very moment, for which some systems refuse it
/// for a while. False if there is none or it still cannot be opened after half a second. Never
/// opens anything but a regular file: a pipe would block.
bool openPatiently(std::ifstream& stream, const std::filesystem::path& file);

} // namespace Mz::Tools
