// SPDX-License-Identifier: BSL-1.0
/// What the limits of starts ask of the system itself, for each system in its own folder.
#pragma once

#include <cstdint>
#include <filesystem>
#include <string>

namespace Mz::Benchmarks {

/// Returns the calls that `openLibrary` and `functionOf` make, as a text for the table.
std::string loadingCalls();

/// Loads a library, which is never unloaded. Returns null if it cannot be loaded.
void* openLibrary(const std::filesystem::path& file);

/// Returns the function `name` of a library, or null if the library does not export it.
void* functionOf(void* library, const char* name);

/// Returns whether this process has loaded a library of the folder.
bool loadedFrom(const std::filesystem::path& folder);

/// Lists the folder and gets the status of each file. Returns the number of files.
long statusOfEach(const std::filesystem::path& folder);

/// Returns the offset of the table of exported names in the file, or 0.
std::uint64_t nameTableOf(const std::filesystem::path& file);

/// Lists the folder, gets the status of each file, opens it, and reads a block at its beginning and
/// one at an offset. Returns the number of files of which both were read.
long readBlocksOfEach(const std::filesystem::path& folder, std::uint64_t offset);

} // namespace Mz::Benchmarks
