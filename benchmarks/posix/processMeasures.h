// SPDX-License-Identifier: BSL-1.0
/// What a process measures of itself.
#pragma once

#include <ctime>
#include <fstream>
#include <malloc.h>
#include <string>

namespace Mz::Benchmarks {

/// Returns the processor time of this process in seconds, which other processes do not affect.
inline double measuredTime() {
    timespec time{};
    ::clock_gettime(CLOCK_PROCESS_CPUTIME_ID, &time);
    return static_cast<double>(time.tv_sec) + static_cast<double>(time.tv_nsec) * 1e-9;
}

/// Returns the bytes that are allocated, by `malloc` or `new`.
inline long allocatedBytes() {
    const struct mallinfo2 info = ::mallinfo2();
    return static_cast<long>(info.uordblks + info.hblkhd);
}

/// Returns the most memory that this process had at a time, in bytes.
inline long peakBytes() {
    std::ifstream status("/proc/self/status");
    for (std::string word; status >> word;) {
        long kilobytes = 0;
        if (word == "VmHWM:" && status >> kilobytes)
            return kilobytes * 1024;
    }
    return 0;
}

} // namespace Mz::Benchmarks
