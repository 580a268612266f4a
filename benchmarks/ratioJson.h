// SPDX-License-Identifier: BSL-1.0
/// Writes the tables of times and of memory as JSON.
#pragma once

#include <cstddef>
#include <iosfwd>
#include <optional>
#include <string>
#include <vector>

namespace Mz::Benchmarks {

/// The median of another library at the same work.
struct PeerTime {
    std::string name;
    double nanoseconds = 0;
};

/// A measured line of the table.
struct RatioLine {
    std::string name, work, limit; ///< UTF-8; invalid bytes are replaced
    double workNanoseconds = 0, limitNanoseconds = 0;
    double ratio = 0, ratioOfFastest = 0;
    std::optional<double> reach, peerReach; ///< left out if there is none
    std::vector<PeerTime> peers;            ///< the fastest first
};

/// A line of the table of memory, in bytes.
struct MemoryLine {
    std::string name, work, limit;
    double workBytes = 0, limitBytes = 0;
};

/// How the measuring program was compiled, and how often it did each work.
struct RunLine {
    std::string compiler, options;
    std::size_t repetitions = 0;
};

/// Writes both tables and the run as a JSON object. A number that is not finite becomes null.
void writeJson(std::ostream& out, const RunLine& run, const std::vector<RatioLine>& lines,
               const std::vector<MemoryLine>& memory);

} // namespace Mz::Benchmarks
