// SPDX-License-Identifier: BSL-1.0
/// Writes the table of ratios as JSON.
#pragma once

#include <iosfwd>
#include <optional>
#include <string>
#include <vector>

namespace Mz::Benchmarks {

/// A measured line of the table.
struct RatioLine {
    std::string name, work, limit; ///< UTF-8; invalid bytes are replaced
    double workNanoseconds = 0, limitNanoseconds = 0;
    double ratio = 0, ratioOfFastest = 0;
    std::optional<double> reach; ///< left out if there is none
};

/// Writes the lines as a JSON array of objects. A number that is not finite becomes null.
void writeJson(std::ostream& out, const std::vector<RatioLine>& lines);

} // namespace Mz::Benchmarks
