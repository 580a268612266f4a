// SPDX-License-Identifier: BSL-1.0
/// The functions of the operating system that tests need. Each system has one source.
#pragma once

#include <cstddef>
#include <cstdint>
#include <filesystem>
#include <string>
#include <vector>

namespace Mz::Test {

/// Returns whether this very file is mapped as a library into this process.
bool isMapped(const std::filesystem::path& library);

/// Loads a library as a host does for its own use. Returns null on failure.
void* loadAsHost(const std::filesystem::path& library);
void unloadAsHost(void* module);

/// Returns the address of an exported function, or null.
void* functionOf(void* module, const char* name);

/// Returns the used bytes of the C library's heap; 0 with the address sanitizer, which detects
/// leaks.
std::size_t allocatedBytes();

/// Returns the number of open descriptors (POSIX) or handles (Windows) of this process.
std::size_t openHandles();

/// Forks, ends the child by `std::exit(0)` and returns its exit code, or -1 if the child did not
/// exit. Returns 0 on systems without fork.
int exitCodeOfCopy();

/// Makes the file hidden by its name or its attributes. Returns its path.
std::filesystem::path hide(const std::filesystem::path& file);

/// Returns whether a child process of this process exists. On POSIX systems a zombie counts too.
bool hasChildProcess();

void setEnvironment(const std::string& name, const std::string& value);

/// Returns `path` as a search path: absolute, and in the system's spelling.
std::wstring searchPathOf(const std::filesystem::path& path);

/// Reserves address space without using memory, writable or not, and keeps it. Returns false on
/// failure.
bool reserveAddresses(std::uint64_t size, bool writable);

/// Allocates shared memory, writes to it, and keeps it. Returns false on failure.
bool useSharedMemory(std::uint64_t size);

/// Closes every pipe of this process except the standard streams.
void closePipes();

/// Writes to every such pipe.
void writeToPipes(const std::string& bytes);

struct ProgramResult {
    bool finished = false; ///< the program exited; the system did not end it
    int exitCode = -1;
    std::string output; ///< standard output, lines ending in "\n"
};

/// Runs a program in `workingDirectory` with the environment of this process and waits for its end.
/// The program finds the shared libraries of the build from any folder. `firstArgument` is its
/// argv[0].
ProgramResult runProgram(const std::filesystem::path& program, const std::string& firstArgument,
                         const std::vector<std::string>& arguments,
                         const std::filesystem::path& workingDirectory);

} // namespace Mz::Test
