// SPDX-License-Identifier: BSL-1.0
// The steps of a start in this process: what is found out about a candidate, and which candidates
// have which record.
#include "components/componentTools/profiling/librarySteps.h"
#include "components/componentTools/profiling/profileChild.h"
#include "tests/tools/toolsFixture.h"

#include <algorithm>
#include <set>
#include <string>
#include <vector>

using namespace Mz;
using namespace Mz::Tools;
using namespace Mz::Test;
using namespace std::chrono_literals;

namespace {

/// Returns what the steps say of these candidates.
ProfileReport stepsOf(const std::vector<StartFile>& files,
                      const std::set<std::size_t>& excluded = {}) {
    std::string bytes;
    StartSteps(files, excluded, [&](const std::string& message) { bytes += message; }).run();
    return decodeProfileReport(bytes, files.size());
}

/// Returns the only candidate in the folder of a test component.
std::vector<StartFile> candidatesOf(const std::wstring& component) {
    std::vector<StartFile> files =
        listStartFiles(Test::searchPathOf(builtComponent(component).parent_path()));
    EXPECT_EQ(files.size(), 1u);
    return files;
}

StartFile fileNamed(const std::wstring& name) {
    return {L"\\folder", name, platform::NativePath(), nullptr};
}

RecordedLibrary recordOf(const std::wstring& name) {
    return {L"\\folder", name, 3, 12, {}};
}

TEST(ProfileSteps, GiveTheVerdictOfAProbe) {
    const std::pair<const wchar_t*, Finding> components[] = {
        {L"goodWithKit", {Verdict::works, L"1", {}}},
        {L"offersNothing", {Verdict::offersNothing, {}, {}}},
        {L"nullDescription", {Verdict::nullDescription, {}, {}}},
        {L"wrongInterface", {Verdict::wrongInterface, {}, {}}},
        {L"offersNull", {Verdict::wrongItem, L"null", {}}},
        {L"offersWrongItem", {Verdict::wrongItem, L"an object of another interface", {}}},
        {L"throwsInLabel", {Verdict::threw, L"its description", L"in the label"}}};
    for (const auto& [name, verdict] : components) {
        const ProfileReport report = stepsOf(candidatesOf(name));
        ASSERT_EQ(report.libraries.size(), 1u) << std::filesystem::path(name);
        EXPECT_EQ(report.libraries[0].verdict, verdict) << std::filesystem::path(name);
        EXPECT_EQ(report.otherFiles, 0u);
    }
}

TEST(ProfileSteps, LeaveALibraryLoadedAsAStartDoesIfItIsSound) {
    const TemporaryDirectory folder;
    for (const wchar_t* name : {L"offersNothing", L"offersNull"}) {
        const std::filesystem::path source = builtComponent(name);
        std::filesystem::copy_file(source, folder.path() / source.filename());
    }
    stepsOf(listStartFiles(Mz::Test::searchPathOf(folder.path())));
    const auto sound = folder.path() / builtComponent(L"offersNothing").filename();
    EXPECT_TRUE(isMapped(sound));
    EXPECT_FALSE(isMapped(folder.path() / builtComponent(L"offersNull").filename()));
    void* const module = loadAsHost(sound);
    unloadAsHost(module); // This test's use of it, then that of the steps.
    unloadAsHost(module);
    EXPECT_FALSE(isMapped(sound));
}

TEST(ProfileSteps, TellABadCastOfTheDescriptionFromAWrongItem) {
    const ProfileReport report = stepsOf(candidatesOf(L"castsInLabel"));
    ASSERT_EQ(report.libraries.size(), 1u);
    EXPECT_EQ(report.libraries[0].verdict.verdict, Verdict::threw);
    EXPECT_EQ(report.libraries[0].verdict.subject, L"its description");
    EXPECT_NE(report.libraries[0].verdict.words, L"");
}

TEST(ProfileSteps, CountOtherCandidatesAndGiveASignOfLifeNowAndThen) {
    const TemporaryDirectory folder;
    std::filesystem::create_directory(folder.path() / "folder");
    folder.write("text", "no library");
    std::vector<StartFile> files(510, fileNamed(L"absent"));
    files[0].found = (folder.path() / "folder").native();
    files[1].found = (folder.path() / "text").native();
    for (std::size_t index = 2; index < files.size(); ++index)
        files[index].found = (folder.path() / "absent").native();
    files.push_back(candidatesOf(L"goodWithKit").front());
    files.push_back(files.back());
    std::vector<std::size_t> counts;
    StartSteps(files, {510, 511}, [&](const std::string& message) {
        counts.push_back(decodeProfileReport(message, files.size()).otherFiles);
    }).run();
    EXPECT_THAT(counts, testing::ElementsAre(256u, 512u, 512u));
}

TEST(ProfileSteps, RegisterTheBuildersOfAnUnchangedRecord) {
    std::vector<StartFile> files = candidatesOf(L"throwsInLabel");
    const auto status = platform::queryFile(files[0].openingPath());
    ASSERT_TRUE(status);
    RecordedLibraries records{{files[0].directory, files[0].fileName, status->time, status->size,
                               std::vector<RecordedBuilder>(3)}};
    findRecords(files, records);
    EXPECT_EQ(stepsOf(files).libraries.at(0).verdict,
              (Finding{Verdict::recordedUnchanged, L"3", {}}));
    records[0].builders.clear();
    const ProfileReport failed = stepsOf(files);
    EXPECT_TRUE(failed.libraries.empty());
    EXPECT_EQ(failed.otherFiles, 1u);
    ++records[0].size;
    EXPECT_EQ(stepsOf(files).libraries.at(0).verdict.verdict, Verdict::threw);
}

TEST(ProfileRecords, AreOfAsManyFilesOfAName) {
    std::vector<StartFile> files{fileNamed(L"a"), fileNamed(L"b"), fileNamed(L"a"),
                                 fileNamed(L"c")};
    const RecordedLibraries records{recordOf(L"a"), recordOf(L"b"), recordOf(L"a"),
                                    recordOf(L"d"), recordOf(L"c"), recordOf(L"c")};
    findRecords(files, records);
    EXPECT_EQ(files[1].record, &records[1]);
    if (platform::namesIgnoreCase()) { // The last record of a name counts, for its first file.
        EXPECT_EQ(files[0].record, &records[2]);
        EXPECT_EQ(files[2].record, nullptr);
        EXPECT_EQ(files[3].record, &records[5]);
    } else {
        EXPECT_EQ(files[0].record, &records[0]);
        EXPECT_EQ(files[2].record, &records[2]);
        EXPECT_EQ(files[3].record, nullptr); // One file, two records.
    }
}

TEST(ProfileRecords, AreThoseOfUnchangedFilesByTimeAndSize) {
    const RecordedLibrary record = recordOf(L"a");
    StartFile file = fileNamed(L"a");
    platform::FileStatus status{};
    status.time = 3;
    status.size = 12;
    EXPECT_FALSE(isUnchanged(file, status));
    file.record = &record;
    EXPECT_TRUE(isUnchanged(file, status));
    ++status.size;
    EXPECT_FALSE(isUnchanged(file, status));
    status.size = 12;
    ++status.time;
    EXPECT_FALSE(isUnchanged(file, status));
}

TEST(ProfileChild, RefusesArgumentsThatAreNotOfAProfile) {
    EXPECT_EQ(runProfileChild({profileArgument, "0", encodeTask({}), ""}), 2);
    EXPECT_EQ(runProfileChild({profileArgument, "0", "no task", "", "folder"}), 2);
    EXPECT_EQ(runProfileChild({profileArgument, "0", "{}", "", "folder"}), 2);
}

TEST(ProfileAnswer, NamesNoLibraryThatWasNotMeasured) {
    StartProfile profile;
    profile.initialize = 5ms;
    EXPECT_EQ(answerOf(profile), L"the start takes 5.00 ms and no library was measured");
    profile.libraries.emplace_back().path = "crashes.so";
    profile.libraries[0].measured = false;
    EXPECT_EQ(answerOf(profile), L"the start takes 5.00 ms and no library was measured");
    profile.libraries[0].measured = true;
    EXPECT_TRUE(answerOf(profile).starts_with(L"crashes.so is the slowest library"));
    profile.libraries[0].times = {};
    profile.initialize = 0ms;
    EXPECT_EQ(profile.shareOf(profile.libraries[0]), 0);
}

} // namespace
