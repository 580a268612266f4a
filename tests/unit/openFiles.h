// SPDX-License-Identifier: BSL-1.0
/// Queries which files are open.
#pragma once

#include <filesystem>

namespace Mz::Test {

/// Returns whether this process has the file open.
bool isOpen(const std::filesystem::path& file);

} // namespace Mz::Test
