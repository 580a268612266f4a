// SPDX-License-Identifier: BSL-1.0
// Writes the table with a JSON library, which escapes the texts.
#include "ratioJson.h"

#include <cmath>
#include <nlohmann/json.hpp>
#include <ostream>

namespace Mz::Benchmarks {

namespace {

/// Keeps only the digits that the measurement supports.
double rounded(double value, double steps) {
    return std::round(value * steps) / steps;
}

} // namespace

void writeJson(std::ostream& out, const std::vector<RatioLine>& lines) {
    using Json = nlohmann::ordered_json;
    Json all = Json::array();
    for (const RatioLine& line : lines) {
        all.push_back({{"name", line.name},
                       {"work", line.work},
                       {"limit", line.limit},
                       {"workNanoseconds", rounded(line.workNanoseconds, 1e3)},
                       {"limitNanoseconds", rounded(line.limitNanoseconds, 1e3)},
                       {"ratio", rounded(line.ratio, 1e4)},
                       {"ratioOfFastest", rounded(line.ratioOfFastest, 1e4)}});
        if (line.reach)
            all.back()["reach"] = *line.reach;
    }
    out << all.dump(2, ' ', false, Json::error_handler_t::replace) << '\n';
}

} // namespace Mz::Benchmarks
