// SPDX-License-Identifier: BSL-1.0
// The start of a host in one call, and the safe mode. Hosts are separate processes.
#include "components/componentTools/start.h"
#include "components/componentTools/disabled.h"
#include "tests/tools/toolsFixture.h"

using namespace Mz;
using namespace Mz::Tools;
using namespace Mz::Test;
using ::testing::HasSubstr;

namespace {

class Start : public ToolsTest {
  protected:
    Start() { add(L"goodWithKit", "good.x"); }

    ProgramResult run(std::vector<std::string> arguments = {}) const {
        const auto program =
            buildFolder / "bin" / (std::wstring(L"startHost") + MZ_PROGRAM_EXTENSION);
        arguments.insert(arguments.begin(), {list().string(), folder.path().string()});
        return runProgram(program, program.string(), arguments, lists.path());
    }

    /// Runs a host that ends regularly, and returns what it prints.
    std::string output(const std::vector<std::string>& arguments = {}) const {
        const ProgramResult result = run(arguments);
        EXPECT_TRUE(result.finished);
        EXPECT_EQ(result.exitCode, 0);
        return result.output;
    }

    /// Returns the number of marks beside the list.
    int marks() const {
        int count = 0;
        for (const auto& entry : std::filesystem::directory_iterator(lists.path()))
            count += entry.path().filename().string().find(".running-") != std::string::npos;
        return count;
    }

    std::filesystem::path list() const { return lists.path() / "list"; }

    TemporaryDirectory lists;
};

TEST_F(Start, ScansWhatIsNewAndWritesTheList) {
    add(L"crashesInEntryPoint", "crash.x");
    EXPECT_EQ(output(), "1 builders, left out\n");
    const ListReading reading = readRecordedList(list());
    ASSERT_EQ(reading.libraries.size(), 2u);
    EXPECT_EQ(reading.libraries[0].kept.value_or(Finding()).verdict, Verdict::crashed);
    EXPECT_EQ(marks(), 0);
    add(L"countedDescription", "new.x");
    EXPECT_EQ(output(), "2 builders, left out\n");
}

TEST_F(Start, LeavesOffWhatTheUserSwitchedOffEvenIfItsFileChanges) {
    output();
    EXPECT_EQ(disableComponent(folder.path() / "good.x", list()).problem, L"");
    std::ofstream(folder.path() / "good.x", std::ios::binary | std::ios::app) << "more";
    EXPECT_EQ(output(), "0 builders, left out\n");
}

TEST_F(Start, WithoutSomeComponentsLeavesThemOutOnce) {
    add(L"countedDescription", "other.x");
    for (const char* name : {"without=good", "without=GOOD.X", "uid"})
        EXPECT_EQ(output({name}), "1 builders, left out good\n") << name;
    EXPECT_EQ(output({"without=absent"}), "2 builders, left out\n");
    EXPECT_EQ(output(), "2 builders, left out\n");
}

TEST_F(Start, LeavesOutALibraryThatNeedsItsHost) {
    // The scan cannot record it, so that the manager would load it.
    add(L"takesFromHost", "needs.x");
    EXPECT_EQ(output({"without=needs"}), "1 builders, left out needs\n");
}

TEST_F(Start, OffersTheSafeModeAfterACrash) {
    output();
    add(L"failsByEnding", "bad.x");
    EXPECT_NE(run().exitCode, 0);
    EXPECT_EQ(marks(), 1);
    EXPECT_EQ(output({"mode=changed"}),
              "unclean work, changed bad, others' bad good\n1 builders, left out bad\n");
    EXPECT_EQ(marks(), 0);
    EXPECT_NE(run().exitCode, 0); // The list has it still.
    EXPECT_EQ(output({"mode=thirdParty", "own=good"}),
              "unclean work, changed bad, others' bad\n1 builders, left out bad\n");
}

TEST_F(Start, KnowsWhatChangedLastThoughAScanRecordedItMeanwhile) {
    output();
    add(L"failsByEnding", "bad.x");
    ScanOptions scanning;
    scanning.folders = {folder.path()};
    scanning.list = list();
    scanning.probe = patient();
    scan(scanning);
    EXPECT_NE(run().exitCode, 0);
    EXPECT_NE(run({"mode=always"}).exitCode, 0);
    EXPECT_THAT(output({"mode=changed"}), HasSubstr("changed bad, others' bad good\n1 builders"));
}

TEST_F(Start, NoticesAHostThatEndsInTheMiddle) {
    EXPECT_EQ(run({"exit"}).exitCode, 0);
    EXPECT_THAT(output(), HasSubstr("unclean work"));
    EXPECT_EQ(output(), "1 builders, left out\n");
}

TEST_F(Start, NoticesAComponentThatEndsTheProcessWhileItStarts) {
    // A library that no scan tries.
    add(L"takesFromHost", "needs.x");
    lists.write("list.running-1", "starting\n"); // As such a process leaves it.
    EXPECT_THAT(output({"mode=changed"}), HasSubstr("unclean start, changed good needs"));
    EXPECT_EQ(marks(), 0);
}

TEST_F(Start, JudgesByTheLatestOfSeveralMarks) {
    // In both orders, for a folder lists its files in any order.
    for (const bool firstIsLatest : {true, false}) {
        const std::filesystem::path files[] = {lists.write("list.running-1", "starting\n"),
                                               lists.write("list.running-2", "working\n")};
        const auto now = std::filesystem::file_time_type::clock::now();
        std::filesystem::last_write_time(files[0], now - std::chrono::hours(firstIsLatest ? 1 : 2));
        std::filesystem::last_write_time(files[1], now - std::chrono::hours(firstIsLatest ? 2 : 1));
        EXPECT_THAT(output(), HasSubstr(firstIsLatest ? "unclean start" : "unclean work"));
        EXPECT_EQ(marks(), 0);
    }
}

TEST_F(Start, TakesFinishForTheCleanEnd) {
    EXPECT_EQ(run({"finish", "exit"}).exitCode, 0);
    EXPECT_EQ(marks(), 0);
    EXPECT_EQ(output(), "1 builders, left out\n");
}

TEST_F(Start, DoesNotTakeAHostThatStillRunsForAnUncleanEnd) {
    Kit::Started started = Kit::start(list(), folder.path());
    EXPECT_TRUE(started);
    EXPECT_FALSE(started.uncleanEnd());
    EXPECT_EQ(started.mode(), Kit::StartMode::asAlways);
    EXPECT_EQ(marks(), 1);
    EXPECT_EQ(output(), "1 builders, left out\n");
    EXPECT_EQ(marks(), 1);
    Kit::Started moved = std::move(started);
    EXPECT_EQ(marks(), 1);
    moved.finish();
    EXPECT_EQ(marks(), 0);
    const Kit::Started again = Kit::start(list(), folder.path());
    EXPECT_FALSE(again);
    EXPECT_EQ(again.problem(), L"the component manager is initialised already");
}

TEST_F(Start, EndsCleanlyWhenAnotherIsAssigned) {
    Kit::Started started = Kit::start(list(), folder.path());
    EXPECT_TRUE(started);
    EXPECT_EQ(marks(), 1);
    started = Kit::start(lists.path() / "other list", folder.path());
    EXPECT_FALSE(started);
    EXPECT_EQ(started.problem(), L"the component manager is initialised already");
    EXPECT_EQ(marks(), 0);
}

TEST_F(Start, WorksWhereNothingCanBeWritten) {
    const auto nowhere = lists.path() / "absent" / "list";
    const Kit::Started started = Kit::startWithout({L"other"}, nowhere, folder.path());
    EXPECT_TRUE(started);
    EXPECT_NE(started.problem(), L"");
    EXPECT_EQ(started.scanned().libraries.size(), 1u);
}

TEST_F(Start, NeedsAFolder) {
    const Kit::Started started = Kit::start(list(), ";");
    EXPECT_FALSE(started);
    EXPECT_EQ(started.problem(), L"the search path names no folder that can be searched");
    EXPECT_EQ(marks(), 0);
}

TEST_F(Start, UsesNothingAfterAnInterruption) {
    Kit::StartOptions options;
    options.list = list();
    options.searchPath = folder.path();
    options.probe.interrupted = [] { return true; };
    const Kit::Started started = Kit::start(options);
    EXPECT_FALSE(started);
    EXPECT_EQ(started.problem(), L"the start was interrupted, so no component is used");
    EXPECT_EQ(marks(), 0);
}

} // namespace
