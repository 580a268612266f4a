// SPDX-License-Identifier: BSL-1.0
/// What the tests need of the operating system: one description, one source for each system.
#pragma once

#include <cstddef>
#include <cstdint>
#include <filesystem>
#include <string>
#include <vector>

namespace Mz::Test {

/// Whether a library is mapped into this process from this very file.
bool isMapped(const std::filesystem::path& library);

/// Loads a library as a host does that wants it for itself; null when that fails.
void* loadAsHost(const std::filesystem::path& library);
void unloadAsHost(void* module);

/// The address of a function that the library exports; null when there is none.
void* functionOf(void* module, const char* name);

/// How much memory of the C library's heap is in use, in bytes. 0 where a sanitizer counts instead.
std::size_t allocatedBytes();

/// Ends a copy of this process by `std::exit(0)` and returns its exit code, -1 when the system
/// ended it. Returns 0 where processes make no copies of themselves.
int exitCodeOfCopy();

/// Makes the system treat the file as hidden, by its name or its attributes, and returns its path.
std::filesystem::path hide(const std::filesystem::path& file);

/// Whether a process that this one started still runs. Where ended processes wait to be asked for
/// their status, one that was not asked counts as well.
bool hasChildProcess();

void setEnvironment(const std::string& name, const std::string& value);

/// `path` as a search path that works on this system: absolute, and in the system's spelling.
std::wstring searchPathOf(const std::filesystem::path& path);

/// Reserves so many bytes of addresses without using any memory, writable or not; false when the
/// system refuses. They stay reserved.
bool reserveAddresses(std::uint64_t size, bool writable);

/// Takes so many bytes of memory that processes could share and writes to them; false when the
/// system refuses. They stay taken.
bool useSharedMemory(std::uint64_t size);

/// Closes every pipe of this process that a library has no business with.
void closePipes();

/// Writes to every such pipe.
void writeToPipes(const std::string& bytes);

struct ProgramResult {
    bool finished = false; ///< ended by itself, not by the system
    int exitCode = -1;
    std::string output; ///< standard output, lines ending in "\n"
};

/// Runs a program in `workingDirectory`, the environment being that of this process, and waits.
/// The shared libraries of the build are found from wherever the program stands.
/// `firstArgument` is what the program is told to be its own name.
ProgramResult runProgram(const std::filesystem::path& program, const std::string& firstArgument,
                         const std::vector<std::string>& arguments,
                         const std::filesystem::path& workingDirectory);

} // namespace Mz::Test
