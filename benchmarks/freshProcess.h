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
};

/// Runs `work` (see start.cpp) on `folder` in a new process. Throws `std::exception` on failure.
FreshResult inFreshProcess(const std::string& work, const std::filesystem::path& folder);

} // namespace Mz::Benchmarks
