// SPDX-License-Identifier: BSL-1.0
// Collects the repetitions of each benchmark and prints medians and their ratios.
#include "ratioTable.h"

#include "textRows.h"

#include <algorithm>
#include <cstdio>
#include <iostream>
#include <stdexcept>
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

std::string reachText(std::optional<double> reach) {
    return reach ? formatted("%.2f", *reach) : "-";
}

void addPeerCells(TextRow& row, const RatioLine& line) {
    std::string names;
    for (const PeerTime& peer : line.peers)
        names += (names.empty() ? "" : ", ") + peer.name + " " + timeText(peer.nanoseconds);
    row.push_back(line.peers.empty()
                      ? "-"
                      : formatted("%.2f", line.workNanoseconds / line.peers[0].nanoseconds));
    row.push_back(reachText(line.peerReach));
    row.push_back(names);
}

} // namespace

void RatioTable::registerBenchmark(const std::string& name, Body body, bool setsTime) {
    auto* const registered = benchmark::RegisterBenchmark(name.c_str(), std::move(body));
    if (setsTime)
        registered->UseManualTime()->Iterations(1)->Unit(benchmark::kMillisecond);
}

void RatioTable::add(const Comparison& comparison, Body work, Body limit) {
    registerBenchmark(comparison.name + "/work", std::move(work), false);
    registerBenchmark(comparison.name + "/limit", std::move(limit), false);
    comparisons.push_back(comparison);
}

void RatioTable::addSelfTimed(const Comparison& comparison, Body work, Body limit) {
    registerBenchmark(comparison.name + "/work", std::move(work), true);
    registerBenchmark(comparison.name + "/limit", std::move(limit), true);
    comparisons.push_back(comparison);
    selfTimed.insert(comparison.name);
}

void RatioTable::addPeer(const std::string& name, const std::string& peer, Body body) {
    if (std::none_of(comparisons.begin(), comparisons.end(),
                     [&](const Comparison& comparison) { return comparison.name == name; }))
        throw std::out_of_range("no comparison is named " + name);
    registerBenchmark(name + "/" + peer, std::move(body), selfTimed.count(name) > 0);
    peers.push_back({name, peer});
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
    constexpr std::size_t textColumns = 2;
    std::vector<TextRow> rows{
        {"work", "limit", "median", "limit's median", "ratio", "of fastest", "reach"}};
    if (!peers.empty())
        rows.front().insert(rows.front().end(), {"of best peer", "reach", "peers"});
    for (const RatioLine& line : ratioLines()) {
        rows.push_back({line.work, line.limit, timeText(line.workNanoseconds),
                        timeText(line.limitNanoseconds), formatted("%.2f", line.ratio),
                        formatted("%.2f", line.ratioOfFastest), reachText(line.reach)});
        if (!peers.empty())
            addPeerCells(rows.back(), line);
    }
    printRows(out, rows, textColumns);
    for (const auto& [name, message] : errors)
        out << name << " failed: " << message << '\n';
}

std::vector<PeerTime> RatioTable::peersOf(const std::string& name) const {
    std::vector<PeerTime> result;
    for (const Peer& peer : peers) {
        const auto times = repetitions.find(name + "/" + peer.name);
        if (peer.comparison == name && times != repetitions.end())
            result.push_back({peer.name, medianOf(times->second)});
    }
    std::sort(result.begin(), result.end(),
              [](const PeerTime& a, const PeerTime& b) { return a.nanoseconds < b.nanoseconds; });
    return result;
}

std::vector<RatioLine> RatioTable::ratioLines() const {
    std::vector<RatioLine> all;
    for (const Line& line : lines()) {
        const Comparison& comparison = *line.comparison;
        all.push_back({comparison.name, comparison.work, comparison.limit, line.work, line.limit,
                       line.ratio(), line.fastestRatio(), comparison.reach, comparison.peerReach,
                       peersOf(comparison.name)});
    }
    return all;
}

std::size_t RatioTable::repetitionCount() const {
    std::size_t most = 0;
    for (const auto& [name, times] : repetitions)
        most = std::max(most, times.size());
    return most;
}

} // namespace Mz::Benchmarks
