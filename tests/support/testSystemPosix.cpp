// SPDX-License-Identifier: BSL-1.0
// The functions for POSIX systems.
#include "tests/support/testSystem.h"

#include <cstdlib>
#include <cstring>
#include <dlfcn.h>
#include <fcntl.h>
#include <fstream>
#include <malloc.h>
#include <sys/mman.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

/// Defined by the address sanitizer; null without it.
extern "C" __attribute__((weak)) std::size_t __sanitizer_get_current_allocated_bytes();

namespace Mz::Test {

bool isMapped(const std::filesystem::path& library) {
    const std::string wanted = std::filesystem::canonical(library).string();
    std::ifstream maps("/proc/self/maps");
    for (std::string line; std::getline(maps, line);)
        if (line.ends_with(" " + wanted))
            return true;
    return false;
}

void* loadAsHost(const std::filesystem::path& library) {
    return ::dlopen(library.c_str(), RTLD_NOW | RTLD_LOCAL);
}

void unloadAsHost(void* module) {
    ::dlclose(module);
}

void* functionOf(void* module, const char* name) {
    return ::dlsym(module, name);
}

std::size_t allocatedBytes() {
    // The sanitizer's own memory grows whenever a library with static objects is loaded. The
    // sanitizer detects leaks itself at the end of the process.
    if (__sanitizer_get_current_allocated_bytes)
        return 0;
    const struct mallinfo2 heap = ::mallinfo2();
    return heap.uordblks + heap.hblkhd;
}

std::size_t openHandles() {
    std::error_code failure;
    std::size_t count = 0;
    for (std::filesystem::directory_iterator entry("/proc/self/fd", failure), end; entry != end;
         ++entry)
        ++count;
    return count;
}

int exitCodeOfCopy() {
    const pid_t copy = ::fork();
    if (copy == 0)
        std::exit(0);
    int status = 0;
    const bool ended = copy > 0 && ::waitpid(copy, &status, 0) == copy && WIFEXITED(status);
    return ended ? WEXITSTATUS(status) : -1;
}

std::filesystem::path hide(const std::filesystem::path& file) {
    std::filesystem::path hidden = file.parent_path() / ("." + file.filename().string());
    std::filesystem::rename(file, hidden);
    return hidden;
}

bool hasChildProcess() {
    siginfo_t ended{};
    return ::waitid(P_ALL, 0, &ended, WEXITED | WNOHANG | WNOWAIT) == 0;
}

void setEnvironment(const std::string& name, const std::string& value) {
    ::setenv(name.c_str(), value.c_str(), 1);
}

std::wstring searchPathOf(const std::filesystem::path& path) {
    return path.wstring();
}

bool reserveAddresses(std::uint64_t size, bool writable) {
    return ::mmap(nullptr, size, writable ? PROT_READ | PROT_WRITE : PROT_NONE,
                  MAP_PRIVATE | MAP_ANONYMOUS | MAP_NORESERVE, -1, 0) != MAP_FAILED;
}

bool useSharedMemory(std::uint64_t size) {
    void* const memory =
        ::mmap(nullptr, size, PROT_READ | PROT_WRITE, MAP_SHARED | MAP_ANONYMOUS, -1, 0);
    if (memory == MAP_FAILED)
        return false;
    std::memset(memory, 1, size);
    return true;
}

namespace {

/// Calls `action` with the descriptor of each pipe except the standard streams.
template <class Action>
void forEachPipe(Action action) {
    struct stat status;
    for (int descriptor = 3; descriptor < 1024; ++descriptor)
        if (::fstat(descriptor, &status) == 0 && S_ISFIFO(status.st_mode))
            action(descriptor);
}

} // namespace

void closePipes() {
    forEachPipe([](int descriptor) { ::close(descriptor); });
}

void writeToPipes(const std::string& bytes) {
    forEachPipe([&](int descriptor) {
        for (std::size_t done = 0; done < bytes.size();) {
            const ssize_t written = ::write(descriptor, bytes.data() + done, bytes.size() - done);
            if (written <= 0)
                return;
            done += static_cast<std::size_t>(written);
        }
    });
}

namespace {

[[noreturn]] void becomeProgram(const std::filesystem::path& program,
                                const std::string& firstArgument,
                                const std::vector<std::string>& arguments,
                                const std::filesystem::path& workingDirectory, int output) {
    std::vector<char*> pointers{const_cast<char*>(firstArgument.c_str())};
    for (const std::string& argument : arguments)
        pointers.push_back(const_cast<char*>(argument.c_str()));
    pointers.push_back(nullptr);
    ::dup2(output, STDOUT_FILENO);
    ::dup2(::open("/dev/null", O_WRONLY), STDERR_FILENO);
    if (::chdir(workingDirectory.c_str()) == 0)
        ::execv(program.c_str(), pointers.data());
    ::_exit(127);
}

} // namespace

ProgramResult runProgram(const std::filesystem::path& program, const std::string& firstArgument,
                         const std::vector<std::string>& arguments,
                         const std::filesystem::path& workingDirectory) {
    ProgramResult result;
    int ends[2];
    if (::pipe(ends) != 0)
        return result;
    const pid_t child = ::fork();
    if (child == 0)
        becomeProgram(program, firstArgument, arguments, workingDirectory, ends[1]);
    ::close(ends[1]);
    char block[4096];
    for (ssize_t got; (got = ::read(ends[0], block, sizeof block)) > 0;)
        result.output.append(block, static_cast<std::size_t>(got));
    ::close(ends[0]);
    int status = 0;
    if (child > 0 && ::waitpid(child, &status, 0) == child) {
        result.finished = WIFEXITED(status);
        result.exitCode = result.finished ? WEXITSTATUS(status) : -1;
    }
    return result;
}

} // namespace Mz::Test
