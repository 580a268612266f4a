// SPDX-License-Identifier: BSL-1.0
/// The system functions of the example beyond the standard library: one declaration, and one
/// implementation per system, selected by the build.
#pragma once

#include <cstddef>
#include <filesystem>

namespace Meshes::system {

/// Returns the number of libraries of this folder that the process has loaded.
std::size_t mappedLibraries(const std::filesystem::path& folder);

} // namespace Meshes::system
