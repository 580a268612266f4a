// SPDX-License-Identifier: BSL-1.0
/// Opens a file that other processes may replace.
#pragma once

#include <filesystem>
#include <fstream>

namespace Mz::Tools {

/// Opens a regular file for reading, with retries: some systems deny access for a moment while the
/// file is being replaced. Opens regular files only, because a pipe would block.
/// \return false if there is no regular file, or it still cannot be opened after half a second
bool openPatiently(std::ifstream& stream, const std::filesystem::path& file);

/// Returns whether there is no such file. A file that cannot be queried may exist.
bool isMissing(const std::filesystem::path& file);

} // namespace Mz::Tools
