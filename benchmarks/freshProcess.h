// SPDX-License-Identifier: BSL-1.0
/// Work that a process can measure only once.
#pragma once

#include <filesystem>
#include <string>

namespace Mz::Benchmarks {

/// The result of a measurement in a new process.
struct FreshResult {
    double seconds = 0; ///< processor time of the work alone, in user and system mode
    long count = 0;     ///< the number of libraries that the work found
    long peakBytes = 0; ///< the most memory that the process had at a time
    long heapBytes = 0; ///< what the work allocated and kept
};

/// Runs `work` (see start.cpp) on `folder` in a new process. Throws `std::exception` on failure.
///
/// \param program  the program that does the work and prints its result as `printResult` does
FreshResult inFreshProcess(const std::string& work, const std::filesystem::path& folder,
                           const std::string& program = MZ_BENCHMARK_START);

} // namespace Mz::Benchmarks
