// SPDX-License-Identifier: BSL-1.0
// Components that the user switched off, in the list, in scans and in what `explain` says.
#include "components/componentTools/disabled.h"
#include "tests/tools/toolsFixture.h"

using namespace Mz;
using namespace Mz::Tools;
using namespace Mz::Test;
using ::testing::HasSubstr;

namespace {

class Disabled : public ToolsTest {
  protected:
    Disabled() : good(add(L"goodWithKit")) { add(L"countedDescription"); }

    std::filesystem::path list() const { return lists.path() / "list"; }

    ScanResult scanned() const {
        ScanOptions wanted;
        wanted.folders = {folder.path()};
        wanted.list = list();
        wanted.probe = patient();
        return scan(wanted);
    }

    /// Returns the scan's result for the component that the tests switch off.
    static ScannedFile ofGood(const ScanResult& result) {
        for (const ScannedFile& file : result.files)
            if (file.path.stem() == "goodWithKit")
                return file;
        ADD_FAILURE() << "not scanned";
        return {};
    }

    void disable(const std::wstring& reason = L"too slow") const {
        const SwitchResult result = disableComponent(good, list(), reason);
        EXPECT_EQ(result.problem, L"");
    }

    Explanation explained(bool load = false) const {
        const ListReading reading = readRecordedList(list());
        ExplainOptions wanted;
        wanted.recorded = &reading.libraries;
        wanted.load = load;
        wanted.probe = patient();
        return explainFile(good, wanted);
    }

    std::string runHost() const {
        const auto program =
            buildFolder / "bin" / (std::wstring(L"recordedHost") + MZ_PROGRAM_EXTENSION);
        return runProgram(program, program.string(), {list().string(), folder.path().string()},
                          lists.path())
            .output;
    }

    void change() const { std::ofstream(good, std::ios::binary | std::ios::app) << "more"; }

    TemporaryDirectory lists;
    const std::filesystem::path good;
};

TEST_F(Disabled, IsNotTouchedByAHostThatReadsTheList) {
    scanned();
    EXPECT_EQ(runHost(), "2 builders, 0 mapped, no word\n2 made\n");
    disable();
    EXPECT_EQ(runHost(), "1 builders, 0 mapped, no word\n1 made\n");
}

TEST_F(Disabled, NeedsNoListBefore) {
    disable();
    const ListReading reading = readRecordedList(list());
    ASSERT_EQ(reading.libraries.size(), 1u);
    EXPECT_TRUE(reading.libraries[0].builders.empty());
    EXPECT_EQ(reading.libraries[0].size,
              static_cast<std::int64_t>(std::filesystem::file_size(good)));
    EXPECT_NE(reading.libraries[0].time, 0u);
    EXPECT_THAT(runHost(), ::testing::StartsWith("1 builders, 1 mapped"));
}

TEST_F(Disabled, StaysSoWhenItsFileChanges) {
    scanned();
    disable();
    change();
    const ScannedFile file = ofGood(scanned());
    EXPECT_EQ(file.verdict.verdict, Verdict::disabledByUser);
    EXPECT_FALSE(file.looked);
    EXPECT_TRUE(file.recorded);
    EXPECT_EQ(runHost(), "1 builders, 0 mapped, no word\n1 made\n");
}

TEST_F(Disabled, StaysSoWhileItsFileIsAway) {
    scanned();
    disable();
    const auto aside = lists.path() / "aside";
    std::filesystem::rename(good, aside);
    EXPECT_EQ(scanned().libraries.size(), 1u);
    std::filesystem::rename(aside, good);
    EXPECT_EQ(ofGood(scanned()).verdict.verdict, Verdict::disabledByUser);
}

TEST_F(Disabled, StaysSoWhenAHostRecordedItsNewFile) {
    scanned();
    const RecordedLibraries before = readRecordedList(list()).libraries;
    disable();
    writeRecordedList(list(), before); // As a host does after the file has changed.
    const Explanation explanation = explained();
    EXPECT_EQ(explanation.verdict.verdict, Verdict::disabledByUser);
    ASSERT_EQ(explanation.notes.size(), 1u);
    EXPECT_EQ(explanation.notes[0].verdict, Verdict::recordedUnchanged);
    scanned();
    EXPECT_EQ(runHost(), "1 builders, 0 mapped, no word\n1 made\n");
}

TEST_F(Disabled, StaysSoWhenTheListIsDamaged) {
    scanned();
    disable();
    std::ofstream(list(), std::ios::binary) << "something else";
    const ScanResult result = scanned();
    EXPECT_NE(result.rejected, L"");
    EXPECT_EQ(ofGood(result).verdict.verdict, Verdict::disabledByUser);
    EXPECT_EQ(disabledComponents(list()).size(), 1u);
}

TEST_F(Disabled, IsKeptWhenItIsSwitchedOffDuringAScan) {
    ScanOptions wanted;
    wanted.folders = {folder.path()};
    wanted.list = list();
    wanted.probe = patient();
    bool done = false;
    wanted.probe.interrupted = [&] {
        if (!std::exchange(done, true))
            disable();
        return false;
    };
    scan(wanted);
    EXPECT_TRUE(done);
    EXPECT_EQ(disabledComponents(list()).size(), 1u);
    EXPECT_EQ(runHost(), "1 builders, 0 mapped, no word\n1 made\n");
}

TEST_F(Disabled, IsExplainedWithTheReason) {
    scanned();
    disable();
    const Explanation explanation = explained();
    EXPECT_EQ(explanation.verdict.verdict, Verdict::disabledByUser);
    EXPECT_EQ(explanation.verdict.subject, L"too slow");
    EXPECT_THAT(sentenceOf(explanation.verdict), HasSubstr(L"switched off in the list (too slow)"));
    EXPECT_TRUE(explanation.notes.empty());
    EXPECT_TRUE(explanation.builders.empty());
    disable(L"");
    EXPECT_EQ(sentenceOf(explained().verdict),
              L"it is switched off in the list, so no host that reads the list loads it");
}

TEST_F(Disabled, IsANoteWhenTheLibraryIsLoaded) {
    disable();
    const Explanation explanation = explained(true);
    EXPECT_EQ(explanation.verdict.verdict, Verdict::works);
    ASSERT_EQ(explanation.notes.size(), 1u);
    EXPECT_EQ(explanation.notes[0].verdict, Verdict::disabledByUser);
}

TEST_F(Disabled, SaysThatAHostLoadsItWhenItHasChangedSinceTheScan) {
    disable();
    change();
    const Explanation explanation = explained();
    EXPECT_EQ(explanation.verdict.verdict, Verdict::disabledByUser);
    ASSERT_EQ(explanation.notes.size(), 1u);
    EXPECT_EQ(explanation.notes[0].verdict, Verdict::recordedChanged);
}

TEST_F(Disabled, WorksAgainAfterItIsSwitchedOn) {
    scanned();
    disable();
    scanned();
    EXPECT_TRUE(enableComponent(good, list()).changed);
    EXPECT_TRUE(disabledComponents(list()).empty());
    EXPECT_EQ(readRecordedList(list()).libraries.size(), 1u);
    const ScannedFile file = ofGood(scanned());
    EXPECT_EQ(file.verdict.verdict, Verdict::works);
    EXPECT_TRUE(file.looked);
    EXPECT_EQ(runHost(), "2 builders, 0 mapped, no word\n2 made\n");
}

TEST_F(Disabled, IsSwitchedOnThoughItsFileIsGone) {
    disable();
    std::filesystem::remove(good);
    EXPECT_TRUE(enableComponent(good, list()).changed);
    EXPECT_TRUE(disabledComponents(list()).empty());
}

TEST_F(Disabled, ReportsWhetherTheStateChanged) {
    EXPECT_TRUE(disableComponent(good, list(), L"one").changed);
    EXPECT_FALSE(disableComponent(good, list(), L"two").changed);
    ASSERT_EQ(disabledComponents(list()).size(), 1u);
    EXPECT_EQ(disabledComponents(list())[0].reason, L"two");
    EXPECT_TRUE(enableComponent(good, list()).changed);
    EXPECT_FALSE(enableComponent(good, list()).changed);
}

TEST_F(Disabled, LeavesTheVerdictsOnOtherLibraries) {
    add(L"crashesInEntryPoint");
    scanned();
    disable();
    EXPECT_TRUE(enableComponent(good, list()).changed);
    for (const RecordedLibrary& library : readRecordedList(list()).libraries)
        if (library.builders.empty()) {
            EXPECT_EQ(library.kept.value_or(Finding()).verdict, Verdict::crashed);
        }
}

TEST_F(Disabled, IsRefusedForWhatIsNotThere) {
    const SwitchResult result = disableComponent(folder.path() / "absent", list());
    EXPECT_FALSE(result.changed);
    EXPECT_THAT(result.problem, HasSubstr(L"absent: there is no such file"));
    EXPECT_FALSE(std::filesystem::exists(list()));
}

TEST_F(Disabled, IsRefusedForAFolder) {
    const std::filesystem::path inner = folder.path() / "inner";
    std::filesystem::create_directory(inner);
    const SwitchResult result = disableComponent(inner, list());
    EXPECT_FALSE(result.changed);
    EXPECT_EQ(result.problem,
              displayName(inner) +
                  L": it is not a regular file, and only regular files are candidates");
    EXPECT_FALSE(std::filesystem::exists(list()));
    EXPECT_FALSE(std::filesystem::exists(verdictsFileOf(list())));
}

TEST_F(Disabled, ChangesNoDamagedFile) {
    std::ofstream(list(), std::ios::binary) << "something else";
    EXPECT_THAT(disableComponent(good, list()).problem, HasSubstr(L"this is no recorded list"));
    EXPECT_EQ(contentOf(list()), "something else");
    std::filesystem::remove(list());
    disable();
    std::ofstream(verdictsFileOf(list())) << "{";
    EXPECT_THAT(enableComponent(good, list()).problem, HasSubstr(L"this file is damaged"));
    EXPECT_THAT(disableComponent(good, list()).problem, HasSubstr(L"this file is damaged"));
    EXPECT_EQ(contentOf(verdictsFileOf(list())), "{");
}

} // namespace
