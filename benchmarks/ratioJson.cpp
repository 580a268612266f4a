// SPDX-License-Identifier: BSL-1.0
// Writes the table with a JSON library, which escapes the texts.
#include "ratioJson.h"

#include <cmath>
#include <nlohmann/json.hpp>
#include <ostream>

namespace Mz::Benchmarks {

namespace {

using Json = nlohmann::ordered_json;

/// Keeps only the digits that the measurement supports.
double rounded(double value, double steps) {
    return std::round(value * steps) / steps;
}

Json jsonOf(const RatioLine& line) {
    Json json{{"name", line.name},
              {"work", line.work},
              {"limit", line.limit},
              {"workNanoseconds", rounded(line.workNanoseconds, 1e3)},
              {"limitNanoseconds", rounded(line.limitNanoseconds, 1e3)},
              {"ratio", rounded(line.ratio, 1e4)},
              {"ratioOfFastest", rounded(line.ratioOfFastest, 1e4)}};
    if (line.reach)
        json["reach"] = *line.reach;
    if (line.peerReach)
        json["peerReach"] = *line.peerReach;
    for (const PeerTime& peer : line.peers)
        json["peers"].push_back(
            {{"name", peer.name}, {"nanoseconds", rounded(peer.nanoseconds, 1e3)}});
    return json;
}

Json jsonOf(const MemoryLine& line) {
    return {{"name", line.name},
            {"work", line.work},
            {"limit", line.limit},
            {"workBytes", std::round(line.workBytes)},
            {"limitBytes", std::round(line.limitBytes)}};
}

template <class Line>
Json arrayOf(const std::vector<Line>& lines) {
    Json all = Json::array();
    for (const Line& line : lines)
        all.push_back(jsonOf(line));
    return all;
}

} // namespace

void writeJson(std::ostream& out, const RunLine& run, const std::vector<RatioLine>& lines,
               const std::vector<MemoryLine>& memory) {
    const Json all{{"compiler", run.compiler},
                   {"options", run.options},
                   {"repetitions", run.repetitions},
                   {"times", arrayOf(lines)},
                   {"memory", arrayOf(memory)}};
    out << all.dump(2, ' ', false, Json::error_handler_t::replace) << '\n';
}

} // namespace Mz::Benchmarks
