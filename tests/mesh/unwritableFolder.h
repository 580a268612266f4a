/// Where files cannot be written.
#pragma once

#include <filesystem>

namespace Meshes {

/// A folder in which nobody can make a file.
std::filesystem::path unwritableFolder();

} // namespace Meshes
