// SPDX-License-Identifier: BSL-1.0
/// Tests the tools while allocations fail: they throw, or their result is the one without failures,
/// and no list loses a record.
#include "components/componentTools/disabled.h"
#include "components/componentTools/graph.h"
#include "tests/support/failingAllocations.h"
#include "tests/tools/toolsFixture.h"

using namespace Mz;
using namespace Mz::Tools;
using namespace Mz::Test;

namespace {

/// A folder with two components, of which one is switched off, and the list of a scan.
class ToolsWithoutMemory : public ToolsTest {
  protected:
    ToolsWithoutMemory() {
        scanned();
        EXPECT_TRUE(disableComponent(counted, list, L"too slow").changed);
        wholeList = contentOf(list);
        wholeVerdicts = contentOf(verdictsFileOf(list));
    }

    ScanResult scanned() const {
        ScanOptions wanted;
        wanted.folders = {folder.path()};
        wanted.list = list;
        wanted.probe = patient();
        return scan(wanted);
    }

    /// Expects that the list and the file beside it are as before.
    void expectSameLists() const {
        EXPECT_EQ(contentOf(list), wholeList);
        EXPECT_EQ(contentOf(verdictsFileOf(list)), wholeVerdicts);
    }

    TemporaryDirectory lists;
    const std::filesystem::path list = lists.path() / "list";
    const std::filesystem::path good = add(L"goodWithKit"), counted = add(L"countedDescription");
    std::string wholeList, wholeVerdicts;
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
        expectSameLists();
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

TEST_F(ToolsWithoutMemory, SwitchesOffAndOnWhollyOrNotAtAll) {
    failEachAllocation([&](Attempt& attempt) {
        SwitchResult result;
        attempt.run([&] {
            try {
                result = disableComponent(good, list, L"also too slow");
            } catch (const QrStreamEx::ExWriteError&) {
                result.problem = L"not written";
            }
        });
        // The choice is stored first. A scan completes what a failure left.
        const auto disabled = disabledComponents(list);
        EXPECT_EQ(disabled.size() == 2, contentOf(verdictsFileOf(list)) != wholeVerdicts);
        EXPECT_EQ(readRecordedList(list).libraries.size(), 2U);
        enableComponent(good, list);
        EXPECT_EQ(disabledComponents(list).size(), 1U);
        lists.write("list", wholeList);
        lists.write("list.verdicts.json", wholeVerdicts);
    });
}

TEST_F(ToolsWithoutMemory, ScansInTheNextCall) {
    failEachAllocation([&](Attempt& attempt) {
        ScanResult result;
        const bool done = attempt.run([&] { result = scanned(); });
        EXPECT_TRUE(attempt.failed || done);
        if (done) {
            EXPECT_EQ(result.files.size(), 2U);
            EXPECT_EQ(result.libraries.size(), 2U);
        }
        expectSameLists();
    });
    EXPECT_EQ(scanned().notWritten, L"");
    expectSameLists();
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

TEST_F(ToolsWithoutMemory, LeavesNoProcessBehind) {
    const int failures = failEachAllocation([&](Attempt& attempt) {
        ProbeResult result;
        result.verdict.verdict = Verdict::works;
        EXPECT_TRUE(attempt.throwsOnFailure([&] { result = probeLibrary(good, patient()); }));
        EXPECT_EQ(result.verdict.verdict, Verdict::works);
        EXPECT_FALSE(hasChildProcess());
    });
    static_cast<void>(failures);
}

} // namespace
