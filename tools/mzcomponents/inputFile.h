// SPDX-License-Identifier: BSL-1.0
/// Checks the files that commands read.
#pragma once

#include <filesystem>
#include <string>

namespace Mz::Commands {

/// Returns why the file cannot be read; empty if it can. Opens regular files only, because opening
/// a pipe would block.
std::wstring obstacleTo(const std::filesystem::path& file);

} // namespace Mz::Commands
