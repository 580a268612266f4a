// SPDX-License-Identifier: BSL-1.0
/// The files that commands read.
#pragma once

#include <filesystem>
#include <string>

namespace Mz::Commands {

/// Returns why the file cannot be read; nothing if it can. Opens nothing but a regular file: a pipe
/// would block.
std::wstring obstacleTo(const std::filesystem::path& file);

} // namespace Mz::Commands
