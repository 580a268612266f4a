// SPDX-License-Identifier: BSL-1.0
/// Traces the program with ptrace: it stops at the begin and at the end of each call.
#include "tests/support/systemCalls.h"

#include <csignal>
#include <cstdlib>
#include <fcntl.h>
#include <fstream>
#include <iterator>
#include <sys/ptrace.h>
#include <sys/wait.h>
#include <unistd.h>

namespace Mz::Test {

namespace {

constexpr int notTraced = 126, notRun = 127;

[[noreturn]] void runTraced(char* const* arguments, int output) {
    ::dup2(output, STDOUT_FILENO);
    if (::ptrace(PTRACE_TRACEME, 0, nullptr, nullptr) != 0)
        ::_exit(notTraced);
    ::execv(arguments[0], arguments);
    ::_exit(notRun);
}

/// Notes the call at whose begin or end the process has stopped.
/// \param call  the number of the call that has begun
void note(pid_t process, long& call, SystemCalls& calls) {
    __ptrace_syscall_info info{};
    if (::ptrace(PTRACE_GET_SYSCALL_INFO, process, sizeof info, &info) <= 0)
        return;
    if (info.op == PTRACE_SYSCALL_INFO_ENTRY) {
        call = static_cast<long>(info.entry.nr);
        ++calls.all;
    } else if (info.op == PTRACE_SYSCALL_INFO_EXIT && info.exit.rval == 0) {
        ++calls.returnedZero[call];
    }
}

/// Follows the process to its end.
void follow(pid_t process, SystemCalls& calls) {
    constexpr int stopOfCall = SIGTRAP | 0x80;
    int status = 0;
    long call = 0;
    for (bool isFirst = true; ::waitpid(process, &status, 0) == process; isFirst = false) {
        if (!WIFSTOPPED(status))
            break;
        const int signal = WSTOPSIG(status);
        if (isFirst) { // The end of exec.
            ::ptrace(PTRACE_SETOPTIONS, process, nullptr,
                     PTRACE_O_TRACESYSGOOD | PTRACE_O_EXITKILL);
            calls.counted = true;
        } else if (signal == stopOfCall) {
            note(process, call, calls);
        }
        const bool passedOn = !isFirst && signal != stopOfCall;
        ::ptrace(PTRACE_SYSCALL, process, nullptr, passedOn ? signal : 0);
    }
    if (WIFEXITED(status))
        calls.exitCode = WEXITSTATUS(status);
}

} // namespace

SystemCalls countSystemCalls(const std::filesystem::path& program,
                             const std::vector<std::string>& arguments) {
    std::vector<char*> pointers{const_cast<char*>(program.c_str())};
    for (const std::string& argument : arguments)
        pointers.push_back(const_cast<char*>(argument.c_str()));
    pointers.push_back(nullptr);
    std::string file = (std::filesystem::temp_directory_path() / "mz-output-XXXXXX").string();
    const int output = ::mkostemp(file.data(), O_CLOEXEC);
    SystemCalls calls;
    const pid_t process = ::fork();
    if (process == 0)
        runTraced(pointers.data(), output);
    if (process > 0)
        follow(process, calls);
    std::ifstream stream(file, std::ios::binary);
    calls.output.assign(std::istreambuf_iterator<char>(stream), {});
    ::close(output);
    ::unlink(file.c_str());
    return calls;
}

} // namespace Mz::Test
