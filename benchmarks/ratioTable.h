// SPDX-License-Identifier: BSL-1.0
/// Each piece of work beside its limit.
#pragma once

#include <benchmark/benchmark.h>

#include <functional>
#include <iosfwd>
#include <map>
#include <optional>
#include <string>
#include <vector>

namespace Mz::Benchmarks {

/// One line of the table: a piece of work, and what it is measured against.
struct Comparison {
    std::string name;            ///< the benchmarks are `name/work` and `name/limit`
    std::string work;            ///< what is measured, for people
    std::string limit;           ///< what it is measured against, for people
    std::optional<double> reach; ///< the ratio to stay within, if there is one
};

/// The comparisons, in the order of the table.
class RatioTable {
  public:
    using Body = std::function<void(benchmark::State&)>;

    /// Adds a line, and a benchmark for either side of it.
    void add(const Comparison& comparison, Body work, Body limit);

    /// The same for bodies that report their own time (`SetIterationTime`), one piece of work each.
    void addSelfTimed(const Comparison& comparison, Body work, Body limit);

    /// Notes one repetition of the benchmark `name`.
    void note(const std::string& name, double nanoseconds);
    void noteError(const std::string& name, const std::string& message);

    /// A line for each comparison of which both sides were measured, and a line for each error.
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

/// Hands the results of all repetitions to a table.
class RatioReporter final : public benchmark::BenchmarkReporter {
  public:
    explicit RatioReporter(RatioTable& table) : table(table) {}

    bool ReportContext(const Context& context) override;
    void ReportRuns(const std::vector<Run>& runs) override;

  private:
    RatioTable& table;
};

} // namespace Mz::Benchmarks
