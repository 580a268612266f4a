/// What the example needs of the operating system beyond the standard library: one description, one
/// source for each system, chosen by the build.
#pragma once

#include <cstddef>
#include <filesystem>

namespace Meshes::system {

/// How many libraries of this folder the process has in its memory.
std::size_t mappedLibraries(const std::filesystem::path& folder);

} // namespace Meshes::system
