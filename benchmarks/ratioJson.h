// SPDX-License-Identifier: BSL-1.0
/// The table of ratios as JSON.
#pragma once

#include <iosfwd>
#include <optional>
#include <string>
#include <vector>

namespace Mz::Benchmarks {

/// One line of the table, measured.
struct RatioLine {
    std::string name, work, limit; ///< UTF-8; what is not counts as damaged and is replaced
    double workNanoseconds = 0, limitNanoseconds = 0;
    double ratio = 0, ratioOfFastest = 0;
    std::optional<double> reach; ///< left out if there is none
};

/// Writes the lines as a JSON array of objects. A figure that is not finite becomes null.
void writeJson(std::ostream& out, const std::vector<RatioLine>& lines);

} // namespace Mz::Benchmarks
