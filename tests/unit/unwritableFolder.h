// SPDX-License-Identifier: BSL-1.0
/// A path at which no file can be created.
#pragma once

#include <filesystem>

namespace Mz::Test {

/// Returns a folder in which no process can create a file.
std::filesystem::path unwritableFolder();

} // namespace Mz::Test
