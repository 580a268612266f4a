// SPDX-License-Identifier: BSL-1.0
/// Runs programs, for each system in its own folder.
#pragma once

#include <string>

namespace Mz::Benchmarks {

/// Runs the program with two arguments and returns its standard output. Throws `std::exception` if
/// it cannot be started, or if it fails.
std::string outputOf(const std::string& program, const std::string& work,
                     const std::string& folder);

} // namespace Mz::Benchmarks
