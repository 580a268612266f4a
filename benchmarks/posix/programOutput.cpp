// SPDX-License-Identifier: BSL-1.0
// Starts the program and reads its output from a pipe.
#include "programOutput.h"

#include <cerrno>
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

} // namespace

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

} // namespace Mz::Benchmarks
