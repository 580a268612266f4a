// SPDX-License-Identifier: BSL-1.0
/// Tests the tools while allocations fail: they throw, or their result is the one without failures,
/// and no list loses a record.
#include "components/componentTools/graph.h"
#include "tests/support/failingAllocations.h"
#include "tests/tools/toolsFixture.h"

using namespace Mz;
using namespace Mz::Tools;
using namespace Mz::Test;

namespace {

/// A folder with two components, and the list of a scan. The file beside the list is removed: JSON
/// values allocate when they are destroyed, so reading it ends the process.
class ToolsWithoutMemory : public ToolsTest {
  protected:
    ToolsWithoutMemory() {
        scanned(list);
        std::filesystem::remove(verdictsFileOf(list));
        wholeList = contentOf(list);
    }

    ScanResult scanned(const std::filesystem::path& file) const {
        ScanOptions wanted;
        wanted.folders = {folder.path()};
        wanted.list = file;
        wanted.probe = patient();
        return scan(wanted);
    }

    TemporaryDirectory lists;
    const std::filesystem::path list = lists.path() / "list";
    const std::filesystem::path good = add(L"goodWithKit"), counted = add(L"countedDescription");
    std::string wholeList;
};

TEST_F(ToolsWithoutMemory, ExplainsInTheNextCall) {
    failEachAllocation([&](Attempt& attempt) {
        Explanation explanation;
        explanation.verdict.verdict = Verdict::component;
        EXPECT_TRUE(attempt.throwsOnFailure([&] { explanation = explainFile(good); }));
        EXPECT_EQ(explanation.verdict.verdict, Verdict::component);
    });
    EXPECT_EQ(explainFile(good).verdict.verdict, Verdict::component);
}

TEST_F(ToolsWithoutMemory, ReadsAndWritesTheListInTheNextCall) {
    const RecordedLibraries whole = readRecordedList(list).libraries;
    ASSERT_EQ(whole.size(), 2U);
    const std::filesystem::path copy = lists.path() / "copy";
    failEachAllocation([&](Attempt& attempt) {
        ListReading reading;
        reading.state = ListReading::State::good;
        EXPECT_TRUE(attempt.throwsOnFailure([&] { reading = readRecordedList(list); }));
        EXPECT_EQ(reading.state, ListReading::State::good);
        EXPECT_EQ(contentOf(list), wholeList);
    });
    failEachAllocation([&](Attempt& attempt) {
        lists.write("copy", "the old one");
        bool refused = false;
        const bool done = attempt.run([&] {
            try {
                writeRecordedList(copy, whole);
            } catch (const QrStreamEx::ExWriteError&) { // A file stream that lacks its buffer.
                refused = true;
            }
        });
        EXPECT_EQ(contentOf(copy), done && !refused ? wholeList : "the old one");
    });
}

TEST_F(ToolsWithoutMemory, DrawsInTheNextCall) {
    const RecordedLibraries libraries = readRecordedList(list).libraries;
    const std::string whole = dotOf(libraries, {});
    failEachAllocation([&](Attempt& attempt) {
        std::string dot = whole;
        EXPECT_TRUE(attempt.throwsOnFailure([&] { dot = dotOf(libraries, {}); }));
        EXPECT_EQ(dot, whole);
    });
}

TEST_F(ToolsWithoutMemory, TriesALibraryInTheNextCallAndLeavesNoProcess) {
    failEachAllocation([&](Attempt& attempt) {
        ProbeResult result;
        result.verdict.verdict = Verdict::works;
        EXPECT_TRUE(attempt.throwsOnFailure([&] { result = probeLibrary(good, patient()); }));
        EXPECT_EQ(result.verdict.verdict, Verdict::works);
        EXPECT_FALSE(hasChildProcess());
    });
    const ScanResult scan = scanned({});
    ASSERT_EQ(scan.libraries.size(), 2U);
    EXPECT_EQ(scan.libraries[0].builders.size() * scan.libraries[1].builders.size(), 1U);
}

} // namespace
