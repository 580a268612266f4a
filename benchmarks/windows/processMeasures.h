// SPDX-License-Identifier: BSL-1.0
/// What a process measures of itself. The memory is measured on Linux alone.
#pragma once

#include <chrono>

namespace Mz::Benchmarks {

/// Returns the time in seconds. Not that of the processor: the system advances it in steps of
/// milliseconds, and under Wine a second process does a part of the work, which would not count.
inline double measuredTime() {
    const auto time = std::chrono::steady_clock::now().time_since_epoch();
    return std::chrono::duration<double>(time).count();
}

inline long allocatedBytes() {
    return 0;
}

inline long peakBytes() {
    return 0;
}

} // namespace Mz::Benchmarks
