// SPDX-License-Identifier: BSL-1.0
/// Writes the files of a recorded list.
#pragma once

#include <filesystem>
#include <string_view>

namespace Mz::Tools {

/// Replaces the file as `replaceFile` does, unless it already has this content.
/// \throws QrStreamEx as `replaceFile`
void replaceChanged(const std::filesystem::path& file, std::string_view content);

} // namespace Mz::Tools
