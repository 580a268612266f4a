// SPDX-License-Identifier: BSL-1.0
// Defines `open` in the program, which takes precedence over that of the C library.
#include "tests/support/failingOpen.h"

#include <cerrno>
#include <cstdarg>
#include <dlfcn.h>
#include <fcntl.h>

namespace {

int openError = 0;

} // namespace

extern "C" __attribute__((visibility("default"))) int open(const char* path, int flags, ...) {
    using Function = int(const char*, int, ...);
    static const auto next = reinterpret_cast<Function*>(::dlsym(RTLD_NEXT, "open"));
    if (openError) {
        errno = openError;
        return -1;
    }
    va_list rest;
    va_start(rest, flags);
    const unsigned int mode = flags & O_CREAT ? va_arg(rest, unsigned int) : 0;
    va_end(rest);
    return next(path, flags, mode);
}

namespace Mz::Test {

FailingOpen::FailingOpen(int error) {
    openError = error;
}

FailingOpen::~FailingOpen() {
    openError = 0;
}

} // namespace Mz::Test
