// SPDX-License-Identifier: BSL-1.0
/// The memory that starts need, and what the manager keeps.
#pragma once

#include "ratioJson.h"

#include <iosfwd>
#include <vector>

namespace Mz::Benchmarks {

/// Measures in new processes. Throws `std::exception` on failure.
std::vector<MemoryLine> measureMemory();

/// Prints a table of the lines.
void printMemory(std::ostream& out, const std::vector<MemoryLine>& lines);

} // namespace Mz::Benchmarks
