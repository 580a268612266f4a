// SPDX-License-Identifier: BSL-1.0
/// Counts the system calls of a program, for tests of how they grow. Counts do not depend on the
/// load of the machine, unlike times.
#pragma once

#include <filesystem>
#include <map>
#include <string>
#include <vector>

namespace Mz::Test {

/// The system calls of one run of a program, without those of the processes that it started.
struct SystemCalls {
    bool counted = false; ///< false if this process may not trace another one
    int exitCode = -1;    ///< -1 if the program did not exit
    std::string output;   ///< standard output
    long all = 0;
    std::map<long, long> returnedZero; ///< by the number of the call
};

/// Runs a program with the environment of this process, and waits for its end.
SystemCalls countSystemCalls(const std::filesystem::path& program,
                             const std::vector<std::string>& arguments);

} // namespace Mz::Test
