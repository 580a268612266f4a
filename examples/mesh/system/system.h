/// What the example needs of the operating system beyond the standard library: one description, one
/// source for each system, chosen by the build.
#pragma once

#include <cstddef>
#include <filesystem>
#include <system_error>

namespace Meshes::system {

/// Makes an empty file of a name that no file has; `std::errc::file_exists` when one has.
std::error_code createNew(const std::filesystem::path& file);

/// Waits until everything in the file `from` stands on the medium, then gives it the name `to`, in
/// one step: whoever opens `to` meanwhile finds the file that was there or the new one.
std::error_code moveSafely(const std::filesystem::path& from, const std::filesystem::path& to);

/// How many libraries of this folder the process has in its memory.
std::size_t mappedLibraries(const std::filesystem::path& folder);

} // namespace Meshes::system
