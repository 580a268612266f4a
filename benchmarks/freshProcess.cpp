// SPDX-License-Identifier: BSL-1.0
// Reads the line that the program printed.
#include "freshProcess.h"

#include "programOutput.h"

#include <cstdio>
#include <stdexcept>

namespace Mz::Benchmarks {

FreshResult inFreshProcess(const std::string& work, const std::filesystem::path& folder,
                           const std::string& program) {
    const std::string output = outputOf(program, work, folder.string());
    FreshResult result;
    if (std::sscanf(output.c_str(), "%lf %ld %ld %ld", &result.seconds, &result.count,
                    &result.peakBytes, &result.heapBytes) != 4)
        throw std::runtime_error("unexpected answer of " + work + ": " + output);
    return result;
}

} // namespace Mz::Benchmarks
