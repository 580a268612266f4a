/// The system functions of the example beyond the standard library: one declaration, and one
/// implementation per system, selected by the build.
#pragma once

#include <cstddef>
#include <filesystem>
#include <system_error>

namespace Meshes::system {

/// Creates an empty file. Returns `std::errc::file_exists` if the name is in use.
std::error_code createNew(const std::filesystem::path& file);

/// Waits until the content of the file `from` has reached the medium, then renames it to `to` in
/// one step: other programs see the old file or the new one.
std::error_code moveSafely(const std::filesystem::path& from, const std::filesystem::path& to);

/// Returns the number of libraries of this folder that the process has loaded.
std::size_t mappedLibraries(const std::filesystem::path& folder);

} // namespace Meshes::system
