// SPDX-License-Identifier: BSL-1.0
// Starts mzBenchmarkStart and reads its result from a pipe.
#include "freshProcess.h"

#include <cerrno>
#include <cstdio>
#include <spawn.h>
#include <stdexcept>
#include <sys/wait.h>
#include <unistd.h>

namespace Mz::Benchmarks {

namespace {

/// Reads the pipe up to its end.
std::string readAll(int descriptor) {
    std::string text;
    char block[256];
    while (true) {
        const ssize_t got = ::read(descriptor, block, sizeof block);
        if (got > 0)
            text.append(block, static_cast<std::size_t>(got));
        else if (got == 0 || errno != EINTR)
            return text;
    }
}

/// Runs the program and returns its standard output.
std::string outputOf(const std::string& program, const std::string& work,
                     const std::string& folder) {
    int ends[2];
    if (::pipe(ends) != 0)
        throw std::runtime_error("cannot make a pipe");
    posix_spawn_file_actions_t actions;
    ::posix_spawn_file_actions_init(&actions);
    ::posix_spawn_file_actions_adddup2(&actions, ends[1], STDOUT_FILENO);
    ::posix_spawn_file_actions_addclose(&actions, ends[0]);
    ::posix_spawn_file_actions_addclose(&actions, ends[1]);
    char* const arguments[] = {const_cast<char*>(program.c_str()), const_cast<char*>(work.c_str()),
                               const_cast<char*>(folder.c_str()), nullptr};
    pid_t process = 0;
    const int failure =
        ::posix_spawn(&process, program.c_str(), &actions, nullptr, arguments, environ);
    ::posix_spawn_file_actions_destroy(&actions);
    ::close(ends[1]);
    const std::string output = failure ? std::string() : readAll(ends[0]);
    ::close(ends[0]);
    int status = 0;
    if (failure || ::waitpid(process, &status, 0) != process || status != 0)
        throw std::runtime_error(program + " " + work + " failed");
    return output;
}

} // namespace

FreshResult inFreshProcess(const std::string& work, const std::filesystem::path& folder,
                           const std::string& program) {
    const std::string output = outputOf(program, work, folder.string());
    FreshResult result;
    if (std::sscanf(output.c_str(), "%lf %ld %ld %ld", &result.seconds, &result.count,
                    &result.peakBytes, &result.heapBytes) != 4)
        throw std::runtime_error("unexpected answer of " + work + ": " + output);
    return result;
}

} // namespace Mz::Benchmarks
