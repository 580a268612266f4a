// SPDX-License-Identifier: BSL-1.0
// Takes the median of a few processes: addresses are random, so that pages and the heap vary a
// little. What each library and each builder needs is the difference of two starts that differ in
// their number alone.
#include "memory.h"

#include "freshProcess.h"
#include "startFolders.h"
#include "textRows.h"

#include <algorithm>
#include <array>
#include <cmath>
#include <cstdio>
#include <stdexcept>
#include <string>

namespace Mz::Benchmarks {

namespace {

constexpr std::size_t repetitions = 5;

struct Memory {
    double peak = 0;
    double heap = 0;
};

double medianOf(std::array<double, repetitions> values) {
    std::sort(values.begin(), values.end());
    return values[repetitions / 2];
}

Memory memoryOf(const std::string& work, const std::filesystem::path& folder, long expected) {
    std::array<double, repetitions> peaks{};
    std::array<double, repetitions> heaps{};
    for (std::size_t repetition = 0; repetition < repetitions; ++repetition) {
        const FreshResult result = inFreshProcess(work, folder);
        if (result.count != expected)
            throw std::runtime_error(work + " found " + std::to_string(result.count) + " of " +
                                     std::to_string(expected));
        peaks[repetition] = static_cast<double>(result.peakBytes);
        heaps[repetition] = static_cast<double>(result.heapBytes);
    }
    return {medianOf(peaks), medianOf(heaps)};
}

std::string thousands(unsigned int count) {
    const std::string text = std::to_string(count);
    if (text.size() <= 3)
        return text;
    return text.substr(0, text.size() - 3) + ',' + text.substr(text.size() - 3);
}

struct Recorded {
    Memory work;
    Memory limit;
};

Recorded recordedStart(const std::filesystem::path& folder, long libraries, long builders) {
    return {memoryOf("initializeRecorded", folder, builders),
            memoryOf("readList", folder, libraries)};
}

MemoryLine bytesForEach(const std::string& name, const std::string& work, const std::string& limit,
                        const Recorded& few, const Recorded& many, double difference) {
    return {name, work, limit, (many.work.heap - few.work.heap) / difference,
            (many.limit.heap - few.limit.heap) / difference};
}

} // namespace

std::vector<MemoryLine> measureMemory() {
    std::vector<MemoryLine> lines;
    for (const unsigned int count : {100U, 1000U}) {
        const std::filesystem::path& folder = componentFolder(count)->path();
        lines.push_back({"memory/first" + std::to_string(count),
                         "peak of a first start, " + thousands(count) + " libraries",
                         "the libraries loaded by hand", memoryOf("initialize", folder, count).peak,
                         memoryOf("load", folder, count).peak});
    }
    std::vector<Recorded> recorded;
    for (const unsigned int count : {100U, 1000U, 4000U}) {
        recorded.push_back(recordedStart(componentFolder(count)->path(), count, count));
        lines.push_back({"memory/recorded" + std::to_string(count),
                         "peak of a start with a recorded list, " + thousands(count) + " libraries",
                         "the list read by hand", recorded.back().work.peak,
                         recorded.back().limit.peak});
    }
    lines.push_back(bytesForEach("memory/library", "each recorded library with one builder",
                                 "in a list and a map by hand", recorded[1], recorded[2], 3000));
    LazyFolder more(MZ_BENCHMARK_COMPONENT, 1000, "recordMany");
    lines.push_back(bytesForEach("memory/builder", "each further builder of a recorded library",
                                 "an entry of a map, without texts", recorded[1],
                                 recordedStart(more.path(), 1000, 11'000), 10'000));
    return lines;
}

void printMemory(std::ostream& out, const std::vector<MemoryLine>& lines) {
    std::vector<TextRow> rows{{"memory", "limit", "bytes", "limit's bytes", "ratio"}};
    for (const MemoryLine& line : lines) {
        char ratio[32];
        std::snprintf(ratio, sizeof ratio, "%.2f", line.workBytes / line.limitBytes);
        rows.push_back({line.work, line.limit, std::to_string(std::lround(line.workBytes)),
                        std::to_string(std::lround(line.limitBytes)), ratio});
    }
    printRows(out, rows, 2);
}

} // namespace Mz::Benchmarks
