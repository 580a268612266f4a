// SPDX-License-Identifier: BSL-1.0
/// What this process uses and how its memory is filled, for the checks of component libraries. Each
/// system has an implementation (`windows/`, `posix/`).
///
/// Functions throw `std::bad_alloc` only.
#pragma once

#include <cstddef>
#include <filesystem>
#include <string>
#include <vector>

namespace Mz::Tools::System {

/// Returns the memory of the C library's heap that is in use, in bytes; 0 if it is not available,
/// as under the sanitizers.
std::size_t heapInUse();

/// Returns the number of threads of this process.
std::size_t threadCount();

/// Returns the number of open files (Linux) or handles (Windows) of this process.
std::size_t openFileCount();

/// Keeps the loaded libraries with these names, as other libraries name them, loaded until the
/// process ends.
void holdLibraries(const std::vector<std::string>& names);

/// Makes the content of new memory differ from that of a process with another `pattern`. On Linux
/// every new block is filled with the pattern. On Windows the heap is used once and freed again, so
/// that new blocks often contain it.
void fillNewMemory(unsigned char pattern);

/// Closes standard input of this process.
void closeStandardInput();

/// Makes a locale with a decimal comma that of the process, for numbers only. Returns false if
/// there is none.
bool useDecimalComma();

/// Returns the settings of the process that a library could change: its folder and its locale.
std::wstring processSettings();

} // namespace Mz::Tools::System
