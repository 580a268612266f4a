// SPDX-License-Identifier: BSL-1.0
/// What the programs have in common that do work in a new process, ours and those of the peers:
/// they measure themselves, and print one line.
#pragma once

#include <algorithm>
#include <cstdio>
#include <ctime>
#include <filesystem>
#include <fstream>
#include <malloc.h>
#include <string>
#include <vector>

namespace Mz::Benchmarks {

/// Returns the processor time of this process, which other processes do not affect.
inline double processorTime() {
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

/// A work that is being measured.
class Measurement {
  public:
    /// Prints the time and the memory since the construction, and what was found.
    ///
    /// \param end  the processor time at the end of the work
    /// \return the exit status of the program
    int print(double end, long count) const {
        std::printf("%.9f %ld %ld %ld\n", end - begin, count, peakBytes(),
                    allocatedBytes() - before);
        return 0;
    }

  private:
    long before = allocatedBytes();
    double begin = processorTime();
};

/// Returns the files of the folder in the order in which the manager loads them.
inline std::vector<std::string> filesOf(const std::filesystem::path& folder) {
    std::vector<std::string> files;
    for (const auto& entry : std::filesystem::directory_iterator(folder))
        if (entry.path().filename().string().front() != '.')
            files.push_back(entry.path().string());
    std::sort(files.begin(), files.end());
    return files;
}

} // namespace Mz::Benchmarks
