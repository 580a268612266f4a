// SPDX-License-Identifier: BSL-1.0
/// Tests how the system calls and the allocations of scans and starts grow with the number of
/// libraries.
#include "tests/support/systemCalls.h"
#include "tests/tools/toolsFixture.h"

#include "components/componentTools/discovery.h"

#include <cstdio>
#include <sys/syscall.h>

using namespace Mz;
using namespace Mz::Tools;
using namespace Mz::Test;

namespace {

/// What one run costs.
struct Cost {
    long calls = 0, allocations = 0;
};

class Growth : public ToolsTest {
  protected:
    void SetUp() override {
        if (!countSystemCalls(host, {"none"}).counted)
            GTEST_SKIP() << "this process may not trace others";
    }

    /// Adds copies of one library, up to `count`, that have one time.
    void addCopies(std::size_t count) {
        for (; copies < count; ++copies) {
            char name[32];
            std::snprintf(name, sizeof name, "library%04zu.so", copies);
            std::filesystem::last_write_time(add(L"smallWithKit", name), time);
        }
    }

    /// Writes the list that a scan of the folder would write, from the record of the first library.
    void writeList() const {
        TemporaryDirectory single;
        const std::filesystem::path file = single.path() / "library.so";
        std::filesystem::copy_file(builtComponent(L"smallWithKit"), file);
        std::filesystem::last_write_time(file, time);
        ScanOptions options;
        options.folders = {single.path()};
        options.probe = patient();
        const RecordedLibraries first = scan(options).libraries;
        ASSERT_EQ(first.size(), 1u);
        ASSERT_EQ(first[0].builders.size(), 1u);
        RecordedLibraries all;
        for (const Candidate& candidate : discover({folder.path()}).candidates) {
            RecordedLibrary& library = all.emplace_back(first[0]);
            library.directory = candidate.directory;
            library.fileName = candidate.fileName;
            library.builders[0].uid = testUid(0x50000 + static_cast<unsigned int>(all.size()));
        }
        writeRecordedList(list(), all);
    }

    /// Runs the host with a list of `count` unchanged libraries, and counts its last run.
    Cost costOf(const std::string& work, std::size_t count, int runs) {
        addCopies(count);
        writeList();
        const std::string before = contentOf(list());
        SystemCalls calls;
        for (int run = 0; run < runs; ++run)
            calls = countSystemCalls(host, {work, list().string(), folder.path().string()});
        Cost cost;
        std::size_t recorded = 0;
        EXPECT_EQ(std::sscanf(calls.output.c_str(), "%ld allocations, %zu recorded",
                              &cost.allocations, &recorded),
                  2)
            << calls.output;
        EXPECT_EQ(recorded, count);
        EXPECT_EQ(contentOf(list()), before);
        cost.calls = calls.all;
        return cost;
    }

    /// Expects the same cost for each library from 100 to 1,000, and no more than these.
    void expectLinear(const std::string& work, double mostCalls, double mostAllocations,
                      int runs = 1) {
        const Cost few = costOf(work, 100, runs), more = costOf(work, 400, runs),
                   many = costOf(work, 1000, runs);
        expectLine("calls", few.calls, more.calls, many.calls, mostCalls);
        expectLine("allocations", few.allocations, more.allocations, many.allocations,
                   mostAllocations);
    }

    std::filesystem::path list() const { return lists.path() / "list"; }

    const std::filesystem::path host = buildFolder / "bin" / "countedHost";
    TemporaryDirectory lists;

  private:
    static void expectLine(const char* what, long few, long more, long many, double most) {
        const double first = static_cast<double>(more - few) / 300;
        const double last = static_cast<double>(many - more) / 600;
        EXPECT_GE(first, 1) << what; // Else something is not counted.
        EXPECT_LE(first, most) << what;
        EXPECT_LE(last, most) << what;
        EXPECT_LE(last, first * 1.05 + 0.1) << what;
    }

    const std::filesystem::file_time_type time = std::filesystem::file_time_type::clock::now();
    std::size_t copies = 0;
};

TEST_F(Growth, OfAScanOfUnchangedLibrariesIsLinear) {
    expectLinear("scan", 24, 90); // Today 23.04 and 83.
}

TEST_F(Growth, OfAScanOfLibrariesThatWereScannedBeforeIsLinear) {
    expectLinear("scan", 3.1, 60, 2); // Today 3.03 and 50: their files are not opened.
}

TEST_F(Growth, OfAStartWithAListIsLinear) {
    expectLinear("start", 1.1, 9); // Today 1.02 and 8.
}

TEST_F(Growth, OfAScanOfNewLibrariesHasNoWaitsThatEndByTheirTime) {
    // The end of their output is no sign of their end, so only that itself can wake the scan.
    constexpr int count = 40;
    for (int number = 0; number < count; ++number)
        add(L"staysAfterPipes", "library" + std::to_string(number));
    const SystemCalls calls =
        countSystemCalls(host, {"scan", list().string(), folder.path().string()});
    EXPECT_EQ(calls.exitCode, 0);
    const RecordedLibraries recorded = readRecordedList(list()).libraries;
    ASSERT_EQ(recorded.size(), std::size_t{count});
    EXPECT_EQ(recorded[0].kept.value_or(Finding{}).verdict, Verdict::answerLost);
    const auto found = calls.returnedZero.find(SYS_ppoll);
    const long expired = found == calls.returnedZero.end() ? 0 : found->second;
    // A busy machine may delay some processes by more than the interval.
    EXPECT_LT(expired, count * 3 / 4);
}

} // namespace
