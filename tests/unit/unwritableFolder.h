// SPDX-License-Identifier: BSL-1.0
/// Where files cannot be written.
#pragma once

#include <filesystem>

namespace Mz::Test {

/// A folder in which nobody can make a file.
std::filesystem::path unwritableFolder();

} // namespace Mz::Test
