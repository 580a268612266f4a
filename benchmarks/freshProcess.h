// SPDX-License-Identifier: BSL-1.0
/// Work that can be measured only once in a process.
#pragma once

#include <filesystem>
#include <string>

namespace Mz::Benchmarks {

/// What a fresh process measured.
struct FreshResult {
    double seconds = 0; ///< of processor time, in user and system mode, for the work alone
    long count = 0;     ///< how many libraries the work found
};

/// Runs `work` (see `start.cpp`) on `folder` in a new process. Throws `std::exception` when that
/// fails.
FreshResult inFreshProcess(const std::string& work, const std::filesystem::path& folder);

} // namespace Mz::Benchmarks
