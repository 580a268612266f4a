// SPDX-License-Identifier: BSL-1.0
/// Benchmarks of works in new processes.
#pragma once

#include "freshProcess.h"
#include "ratioTable.h"
#include "startFolders.h"

#include <string>

namespace Mz::Benchmarks {

/// Returns a benchmark of `work` in new processes. Each must find `expected` libraries.
///
/// \param program  the program that does the work, or empty for mzBenchmarkStart
RatioTable::Body freshly(const std::string& work, const SharedFolder& folder, long expected,
                         const std::string& program = {});

} // namespace Mz::Benchmarks
