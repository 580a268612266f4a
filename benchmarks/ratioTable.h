// SPDX-License-Identifier: BSL-1.0
/// The table that compares each work with its limit.
#pragma once

#include "ratioJson.h"

#include <benchmark/benchmark.h>

#include <cstddef>
#include <functional>
#include <iosfwd>
#include <map>
#include <optional>
#include <set>
#include <string>
#include <vector>

namespace Mz::Benchmarks {

/// A line of the table: a work and the limit with which it is compared.
struct Comparison {
    std::string name;                     ///< the benchmarks are `name/work` and `name/limit`
    std::string work;                     ///< what is measured, as a text
    std::string limit;                    ///< what it is compared with, as a text
    std::optional<double> reach = {};     ///< the target of the ratio, if there is one
    std::optional<double> peerReach = {}; ///< the target of the ratio to the best peer
};

/// The comparisons in the order of the table.
class RatioTable {
  public:
    using Body = std::function<void(benchmark::State&)>;

    /// Adds a line, and a benchmark for each of the two bodies.
    void add(const Comparison& comparison, Body work, Body limit);

    /// The same for bodies that set their time (`SetIterationTime`) and do their work once per
    /// iteration.
    void addSelfTimed(const Comparison& comparison, Body work, Body limit);

    /// Adds another library that does the work of the comparison `name`, as a third benchmark.
    /// Throws `std::out_of_range` if there is no such comparison. The body sets its time if the
    /// bodies of the comparison do.
    void addPeer(const std::string& name, const std::string& peer, Body body);

    /// Adds the time of one repetition of the benchmark `name`.
    void note(const std::string& name, double nanoseconds);
    void noteError(const std::string& name, const std::string& message);

    /// Prints a line for each comparison of which both sides were measured, and a line for each
    /// error.
    void print(std::ostream& out) const;
    /// Returns the same lines with all peers.
    std::vector<RatioLine> ratioLines() const;

    /// Returns the largest number of repetitions of a benchmark.
    std::size_t repetitionCount() const;

    bool failed() const { return !errors.empty(); }

  private:
    struct Line {
        const Comparison* comparison;
        double work;
        double limit;
        double fastestWork;
        double fastestLimit;
        double ratio() const { return work / limit; }
        double fastestRatio() const { return fastestWork / fastestLimit; }
    };
    std::vector<Line> lines() const;
    std::vector<PeerTime> peersOf(const std::string& name) const;
    void registerBenchmark(const std::string& name, Body body, bool selfTimed);

    struct Peer {
        std::string comparison;
        std::string name;
    };

    std::vector<Comparison> comparisons;
    std::set<std::string> selfTimed; ///< the names of these comparisons
    std::vector<Peer> peers;
    std::map<std::string, std::vector<double>> repetitions;
    std::map<std::string, std::string> errors;
};

} // namespace Mz::Benchmarks
