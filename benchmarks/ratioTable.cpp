// SPDX-License-Identifier: BSL-1.0
// Collects the repetitions of each benchmark and prints medians and their ratios.
#include "ratioTable.h"

#include "ratioJson.h"

#include <algorithm>
#include <array>
#include <cstdio>
#include <iostream>
#include <utility>

namespace Mz::Benchmarks {

namespace {

double medianOf(std::vector<double> values) {
    std::sort(values.begin(), values.end());
    const std::size_t middle = values.size() / 2;
    return values.size() % 2 ? values[middle] : (values[middle - 1] + values[middle]) / 2;
}

double fastestOf(const std::vector<double>& values) {
    return *std::min_element(values.begin(), values.end());
}

std::string formatted(const char* format, double value) {
    char text[64];
    std::snprintf(text, sizeof text, format, value);
    return text;
}

std::string timeText(double nanoseconds) {
    if (nanoseconds < 1e3)
        return formatted("%.2f ns", nanoseconds);
    return nanoseconds < 1e6 ? formatted("%.2f us", nanoseconds / 1e3)
                             : formatted("%.2f ms", nanoseconds / 1e6);
}

using Cells = std::array<std::string, 7>;

void printCells(std::ostream& out, const std::vector<Cells>& rows) {
    std::array<std::size_t, std::tuple_size_v<Cells>> widths{};
    for (const Cells& row : rows)
        for (std::size_t column = 0; column < row.size(); ++column)
            widths[column] = std::max(widths[column], row[column].size());
    for (const Cells& row : rows) {
        for (std::size_t column = 0; column < row.size(); ++column) {
            const std::string padding(widths[column] - row[column].size(), ' ');
            // Texts are left-aligned, numbers right-aligned.
            const bool figure = column > 1;
            out << (column ? " | " : "| ") << (figure ? padding : "") << row[column]
                << (figure ? "" : padding);
        }
        out << " |\n";
    }
}

} // namespace

void RatioTable::add(const Comparison& comparison, Body work, Body limit) {
    benchmark::RegisterBenchmark((comparison.name + "/work").c_str(), std::move(work));
    benchmark::RegisterBenchmark((comparison.name + "/limit").c_str(), std::move(limit));
    comparisons.push_back(comparison);
}

void RatioTable::addSelfTimed(const Comparison& comparison, Body work, Body limit) {
    for (const auto& [side, body] : {std::pair("/work", work), std::pair("/limit", limit)})
        benchmark::RegisterBenchmark((comparison.name + side).c_str(), body)
            ->UseManualTime()
            ->Iterations(1)
            ->Unit(benchmark::kMillisecond);
    comparisons.push_back(comparison);
}

void RatioTable::note(const std::string& name, double nanoseconds) {
    repetitions[name].push_back(nanoseconds);
}

void RatioTable::noteError(const std::string& name, const std::string& message) {
    errors[name] = message;
}

std::vector<RatioTable::Line> RatioTable::lines() const {
    std::vector<Line> result;
    for (const Comparison& comparison : comparisons) {
        const auto work = repetitions.find(comparison.name + "/work");
        const auto limit = repetitions.find(comparison.name + "/limit");
        if (work != repetitions.end() && limit != repetitions.end())
            result.push_back({&comparison, medianOf(work->second), medianOf(limit->second),
                              fastestOf(work->second), fastestOf(limit->second)});
    }
    return result;
}

void RatioTable::print(std::ostream& out) const {
    std::vector<Cells> rows{
        {"work", "limit", "median", "limit's median", "ratio", "of fastest", "reach"}};
    for (const Line& line : lines()) {
        const Comparison& comparison = *line.comparison;
        rows.push_back({comparison.work, comparison.limit, timeText(line.work),
                        timeText(line.limit), formatted("%.2f", line.ratio()),
                        formatted("%.2f", line.fastestRatio()),
                        comparison.reach ? formatted("%.2f", *comparison.reach) : "-"});
    }
    printCells(out, rows);
    for (const auto& [name, message] : errors)
        out << name << " failed: " << message << '\n';
}

void RatioTable::printJson(std::ostream& out) const {
    std::vector<RatioLine> all;
    for (const Line& line : lines())
        all.push_back({line.comparison->name, line.comparison->work, line.comparison->limit,
                       line.work, line.limit, line.ratio(), line.fastestRatio(),
                       line.comparison->reach});
    writeJson(out, all);
}

bool RatioReporter::ReportContext(const Context& context) {
    PrintBasicContext(&GetErrorStream(), context);
    return true;
}

void RatioReporter::ReportRuns(const std::vector<Run>& runs) {
    for (const Run& run : runs) {
        if (run.run_type != Run::RT_Iteration)
            continue;
        const std::string& name = run.run_name.function_name;
        if (run.error_occurred) {
            table.noteError(name, run.error_message);
            continue;
        }
        const bool selfTimed = !run.run_name.time_type.empty();
        const double time = selfTimed ? run.GetAdjustedRealTime() : run.GetAdjustedCPUTime();
        table.note(name, time / benchmark::GetTimeUnitMultiplier(run.time_unit) * 1e9);
    }
}

} // namespace Mz::Benchmarks
