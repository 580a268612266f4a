// SPDX-License-Identifier: BSL-1.0
/// What the programs have in common that do work in a new process, ours and those of the peers:
/// they measure themselves, and print one line.
#pragma once

#include "processMeasures.h"

#include <algorithm>
#include <cstdio>
#include <filesystem>
#include <string>
#include <vector>

namespace Mz::Benchmarks {

/// A work that is being measured.
class Measurement {
  public:
    /// Prints the time and the memory since the construction, and what was found.
    ///
    /// \param end  the time at the end of the work
    /// \return the exit status of the program
    int print(double end, long count) const {
        std::printf("%.9f %ld %ld %ld\n", end - begin, count, peakBytes(),
                    allocatedBytes() - before);
        return 0;
    }

  private:
    long before = allocatedBytes();
    double begin = measuredTime();
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
