// SPDX-License-Identifier: BSL-1.0
#include "tests/guarding/components/system.h"

#include <csignal>
#include <sys/socket.h>
#include <sys/stat.h>
#include <sys/types.h>
#include <unistd.h>

namespace Mz::Test {

void closeEverything() {
    constexpr int most = 2048;
    for (int descriptor = 0; descriptor < most; ++descriptor)
        ::close(descriptor);
}

void killSelf() {
    ::kill(::getpid(), SIGKILL);
}

void freeze() {
    ::kill(::getpid(), SIGSTOP);
}

bool openConnection() {
    const int socket = ::socket(AF_INET, SOCK_DGRAM, 0);
    if (socket >= 0)
        ::close(socket);
    return socket >= 0;
}

bool startProcess() {
    const pid_t child = ::fork();
    if (child == 0)
        ::_exit(0);
    return child > 0;
}

bool endParent() {
    // Signal 0 asks only; a signal that continues a running process has no effect.
    return ::kill(::getppid(), 0) == 0 || ::kill(::getppid(), SIGCONT) == 0;
}

bool changeOwnFile() {
    struct stat status;
    return ::stat(".", &status) == 0 && ::chmod(".", status.st_mode) == 0;
}

} // namespace Mz::Test
