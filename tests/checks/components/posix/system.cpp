// SPDX-License-Identifier: BSL-1.0
#include "tests/checks/components/system.h"

#include <dlfcn.h>
#include <fcntl.h>
#include <pthread.h>
#include <unistd.h>

namespace Mz::Test {

bool holdThisLibrary() {
    Dl_info info;
    return ::dladdr(reinterpret_cast<const void*>(&holdThisLibrary), &info) != 0 &&
           ::dlopen(info.dli_fname, RTLD_LAZY | RTLD_NOLOAD);
}

bool leaveFileOpen() {
    return ::open("/dev/null", O_RDONLY | O_CLOEXEC) >= 0;
}

bool leaveThreadRunning() {
    const auto wait = [](void*) -> void* {
        for (;;)
            ::pause();
    };
    pthread_t thread{};
    return ::pthread_create(&thread, nullptr, wait, nullptr) == 0 && ::pthread_detach(thread) == 0;
}

bool hasStandardInput() {
    return ::fcntl(STDIN_FILENO, F_GETFD) >= 0;
}

} // namespace Mz::Test
