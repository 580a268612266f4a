// SPDX-License-Identifier: BSL-1.0
/// The table that compares each work with its limit.
#pragma once

#include <benchmark/benchmark.h>

#include <functional>
#include <iosfwd>
#include <map>
#include <optional>
#include <string>
#include <vector>

namespace Mz::Benchmarks {

/// A line of the table: a work and the limit with which it is compared.
struct Comparison {
    std::string name;            ///< the benchmarks are `name/work` and `name/limit`
    std::string work;            ///< what is measured, as a text
    std::string limit;           ///< what it is compared with, as a text
    std::optional<double> reach; ///< the target of the ratio, if there is one
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

    /// Adds the time of one repetition of the benchmark `name`.
    void note(const std::string& name, double nanoseconds);
    void noteError(const std::string& name, const std::string& message);

    /// Prints a line for each comparison of which both sides were measured, and a line for each
    /// error.
    void print(std::ostream& out) const;
    void printJson(std::ostream& out) const;

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

    std::vector<Comparison> comparisons;
    std::map<std::string, std::vector<double>> repetitions;
    std::map<std::string, std::string> errors;
};

/// Passes the results of all repetitions to a table.
class RatioReporter final : public benchmark::BenchmarkReporter {
  public:
    explicit RatioReporter(RatioTable& table) : table(table) {}

    bool ReportContext(const Context& context) override;
    void ReportRuns(const std::vector<Run>& runs) override;

  private:
    RatioTable& table;
};

} // namespace Mz::Benchmarks
