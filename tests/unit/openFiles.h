// SPDX-License-Identifier: BSL-1.0
/// Whether files are open.
#pragma once

#include <filesystem>

namespace Mz::Test {

/// Whether this process holds the file open.
bool isOpen(const std::filesystem::path& file);

} // namespace Mz::Test
