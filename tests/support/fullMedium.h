// SPDX-License-Identifier: BSL-1.0
/// A medium that becomes full, on POSIX systems.
#pragma once

#include <csignal>
#include <sys/resource.h>

namespace Mz::Test {

/// While it lives, files of this process cannot grow beyond `size` bytes, as on a full medium.
class FullMedium {
  public:
    explicit FullMedium(rlim_t size) {
        std::signal(SIGXFSZ, SIG_IGN); // A write fails instead of ending the process.
        limitFiles(size);
    }
    ~FullMedium() { limitFiles(RLIM_INFINITY); }
    FullMedium(const FullMedium&) = delete;
    FullMedium& operator=(const FullMedium&) = delete;

  private:
    static void limitFiles(rlim_t size) {
        rlimit limit{};
        ::getrlimit(RLIMIT_FSIZE, &limit);
        limit.rlim_cur = size;
        ::setrlimit(RLIMIT_FSIZE, &limit);
    }
};

} // namespace Mz::Test
