// SPDX-License-Identifier: BSL-1.0
/// The measurement of a start. The slow libraries sleep, so that known times dominate, and the
/// bounds hold on a busy machine.
#include "components/componentTools/profile.h"

#include "components/componentTools/consoleText.h"
#include "components/componentTools/profileChart.h"
#include "tests/tools/toolsFixture.h"
#include "tests/tools/xmlCheck.h"

#include <clocale>
#include <cmath>
#include <fstream>

using namespace Mz;
using namespace Mz::Tools;
using namespace Mz::Test;
using namespace std::chrono_literals;
using ::testing::HasSubstr;
using ::testing::Not;

namespace {

/// The sleep of a slow library, less the inaccuracy of the clocks.
constexpr auto slow = 190ms;

class Profile : public ToolsTest {
  protected:
    ProfileOptions options(int runs = 1) const {
        ProfileOptions wanted;
        wanted.folders = {folder.path()};
        wanted.runs = runs;
        wanted.process = patient();
        return wanted;
    }

    std::filesystem::path list() const { return lists.path() / "list"; }

    void writeList() const {
        ScanOptions wanted;
        wanted.folders = {folder.path()};
        wanted.list = list();
        wanted.probe = patient();
        scan(wanted);
    }

    static const ProfiledLibrary& find(const StartProfile& profile, const std::wstring& name) {
        static const ProfiledLibrary none{};
        for (const ProfiledLibrary& library : profile.libraries)
            if (library.path.filename() == name + MZ_LIBRARY_EXTENSION ||
                library.path.filename() == name)
                return library;
        ADD_FAILURE() << "no result for " << std::filesystem::path(name);
        return none;
    }

    /// Expects that the library is the slowest, and slow in this phase only.
    static void expectSlowIn(StartPhase phase, const StartProfile& profile,
                             const std::wstring& name) {
        ASSERT_FALSE(profile.libraries.empty());
        const ProfiledLibrary& slowest = profile.libraries.front();
        EXPECT_EQ(slowest.path.filename(), name + MZ_LIBRARY_EXTENSION);
        EXPECT_EQ(slowest.longestPhase(), phase);
        EXPECT_EQ(slowest.verdict.verdict, Verdict::works);
        for (std::size_t other = 0; other < startPhaseCount; ++other)
            if (other == static_cast<std::size_t>(phase))
                EXPECT_GE(slowest.times[other], slow);
            else
                EXPECT_LT(slowest.times[other], slow) << other;
        EXPECT_GT(profile.shareOf(slowest), 0.4);
        EXPECT_LE(profile.shareOf(slowest), 1.0);
        const std::wstring answer = answerOf(profile);
        EXPECT_THAT(answer,
                    ::testing::StartsWith(name + MZ_LIBRARY_EXTENSION + L" is the slowest"));
        EXPECT_THAT(answer, HasSubstr(std::wstring(L"for ") + titleOf(phase)));
    }

    TemporaryDirectory lists;
};

TEST_F(Profile, NamesTheLibraryWithTheSlowInitialiserFirst) {
    add(L"goodWithKit", L"a");
    add(L"sleepsInInitialiser");
    add(L"notes", L"z");
    const StartProfile profile = profileStart(options(3));
    ASSERT_EQ(profile.libraries.size(), 3u);
    expectSlowIn(StartPhase::load, profile, L"sleepsInInitialiser");
    EXPECT_EQ(profile.problem, L"");
}

TEST_F(Profile, PutsASlowDescriptionIntoItsColumn) {
    add(L"goodWithKit");
    add(L"sleepsInDescription");
    expectSlowIn(StartPhase::description, profileStart(options(3)), L"sleepsInDescription");
}

TEST_F(Profile, PutsASlowBuilderDescriptionIntoTheRegistration) {
    add(L"goodWithKit");
    add(L"sleepsInBuilder");
    expectSlowIn(StartPhase::registration, profileStart(options(3)), L"sleepsInBuilder");
}

TEST_F(Profile, AddsUpToTheManagersOwnInitialize) {
    add(L"sleepsInInitialiser", L"a");
    add(L"sleepsInInitialiser", L"b");
    add(L"sleepsInDescription", L"c");
    add(L"sleepsInBuilder", L"d");
    add(L"goodWithKit", L"e");
    folder.write("text", "no library");
    const StartProfile profile = profileStart(options(3));
    ASSERT_TRUE(profile.initialize);
    EXPECT_EQ(profile.runs, 3);
    EXPECT_GE(*profile.initialize, 4 * slow);
    const double whole = static_cast<double>(profile.initialize->count());
    const double sum = static_cast<double>(profile.sum().count());
    EXPECT_LT(std::abs(whole - sum) / whole, 0.1) << whole << " " << sum;
    EXPECT_EQ(profile.otherFiles, 1u);
    EXPECT_GT(profile.otherTime, 0ns);
    EXPECT_GT(profile.listing, 0ns);
    EXPECT_FALSE(profile.listReading);
    std::chrono::nanoseconds parts = profile.otherTime + profile.listing;
    for (const ProfiledLibrary& library : profile.libraries) {
        EXPECT_TRUE(library.loaded && library.measured);
        EXPECT_GT(library.times[static_cast<std::size_t>(StartPhase::probe)], 0ns);
        EXPECT_FALSE(library.record);
        parts += library.total();
    }
    EXPECT_EQ(parts, profile.sum());
    EXPECT_EQ(profile.libraries.back().path.filename(), "e");
}

TEST_F(Profile, NamesLibrariesThatEndTheProcessAndMeasuresTheOthers) {
    add(L"crashesInEntryPoint");
    add(L"crashesInInitialiser");
    add(L"exits");
    add(L"aborts");
    add(L"sleepsInInitialiser");
    add(L"goodWithKit");
    const StartProfile profile = profileStart(options());
    EXPECT_EQ(find(profile, L"crashesInEntryPoint").verdict.verdict, Verdict::crashed);
    EXPECT_EQ(find(profile, L"crashesInInitialiser").verdict.verdict, Verdict::crashed);
    EXPECT_EQ(find(profile, L"exits").verdict.verdict, Verdict::exited);
    EXPECT_EQ(find(profile, L"aborts").verdict.verdict, Verdict::aborted);
    for (const wchar_t* name : {L"crashesInEntryPoint", L"exits", L"aborts"}) {
        EXPECT_FALSE(find(profile, name).measured);
        EXPECT_EQ(find(profile, name).total(), 0ns);
    }
    EXPECT_TRUE(find(profile, L"goodWithKit").measured);
    expectSlowIn(StartPhase::load, profile, L"sleepsInInitialiser");
    ASSERT_TRUE(profile.initialize);
    EXPECT_GE(*profile.initialize, slow);
    EXPECT_EQ(profile.problem, L"");
    EXPECT_EQ(profile.otherFiles, 0u);
}

TEST_F(Profile, ExplainsACrashByAForeignStamp) {
    add(L"crashesWithForeignStamp");
    add(L"crashesInEntryPoint");
    add(L"stampedOtherVersion");
    add(L"goodWithKit");
    const StartProfile profile = profileStart(options());
    const ProfiledLibrary& foreign = find(profile, L"crashesWithForeignStamp");
    EXPECT_EQ(foreign.verdict.verdict, Verdict::otherAbi);
    EXPECT_THAT(sentenceOf(foreign.verdict), HasSubstr(L"version"));
    EXPECT_FALSE(foreign.measured);
    EXPECT_EQ(foreign.total(), 0ns);
    EXPECT_EQ(find(profile, L"crashesInEntryPoint").verdict.verdict, Verdict::crashed);
    // Only the libraries that end the process are explained: the manager loads this one.
    EXPECT_EQ(find(profile, L"stampedOtherVersion").verdict.verdict, Verdict::works);
    EXPECT_TRUE(find(profile, L"stampedOtherVersion").measured);
    EXPECT_TRUE(find(profile, L"goodWithKit").measured);
    EXPECT_TRUE(profile.initialize);
    EXPECT_EQ(profile.problem, L"");
}

TEST_F(Profile, TellsFilesApartWhoseNamesDifferOnlyInCase) {
    add(L"goodWithKit", L"a");
    if (std::filesystem::exists(folder.path() / "A"))
        GTEST_SKIP() << "names ignore case here";
    add(L"crashesInEntryPoint", L"A");
    const StartProfile profile = profileStart(options());
    ASSERT_EQ(profile.libraries.size(), 2u);
    EXPECT_EQ(find(profile, L"a").verdict.verdict, Verdict::works);
    EXPECT_EQ(find(profile, L"A").verdict.verdict, Verdict::crashed);
    EXPECT_TRUE(profile.initialize);
    EXPECT_EQ(profile.problem, L"");
}

TEST_F(Profile, ExcludesALibraryThatHangs) {
    add(L"loopsForever");
    add(L"goodWithKit");
    ProfileOptions wanted = options();
    wanted.process.timeLimit = 5s;
    const StartProfile profile = profileStart(wanted);
    EXPECT_EQ(find(profile, L"loopsForever").verdict.verdict, Verdict::timedOut);
    EXPECT_FALSE(find(profile, L"loopsForever").measured);
    EXPECT_EQ(find(profile, L"goodWithKit").verdict.verdict, Verdict::works);
    EXPECT_TRUE(profile.initialize);
}

TEST_F(Profile, LimitsTheMemory) {
    add(L"eatsMemory");
    add(L"goodWithKit");
    ProfileOptions wanted = options();
    wanted.process.memoryLimit = std::uint64_t{300} << 20;
    const StartProfile profile = profileStart(wanted);
    EXPECT_EQ(find(profile, L"eatsMemory").verdict.verdict, Verdict::outOfMemory);
    EXPECT_TRUE(profile.initialize);
}

TEST_F(Profile, MeasuresALibraryThatFailsAndGivesItTheVerdictOfAScan) {
    add(L"missesDependency");
    add(L"throwsInEnumerate");
    add(L"nullDescription");
    const StartProfile profile = profileStart(options());
    EXPECT_EQ(find(profile, L"missesDependency").verdict.verdict, Verdict::dependencyMissing);
    EXPECT_EQ(find(profile, L"throwsInEnumerate").verdict.verdict, Verdict::threw);
    EXPECT_EQ(find(profile, L"nullDescription").verdict.verdict, Verdict::nullDescription);
    for (const ProfiledLibrary& library : profile.libraries) {
        EXPECT_TRUE(library.measured);
        EXPECT_GT(library.times[static_cast<std::size_t>(StartPhase::load)], 0ns);
    }
    EXPECT_TRUE(profile.initialize);
}

TEST_F(Profile, OfAStartWithAListLoadsOnlyWhatIsNewOrHasChanged) {
    add(L"sleepsInInitialiser", L"a");
    const auto changed = add(L"goodWithKit", L"b");
    folder.write("text", "no library");
    writeList();
    std::filesystem::last_write_time(changed, std::filesystem::last_write_time(changed) - 5s);
    add(L"notes", L"c");
    ProfileOptions wanted = options();
    wanted.list = list();
    const StartProfile profile = profileStart(wanted);
    ASSERT_EQ(profile.libraries.size(), 3u);
    EXPECT_EQ(profile.otherFiles, 1u);

    const ProfiledLibrary& unchanged = find(profile, L"a");
    EXPECT_FALSE(unchanged.loaded);
    EXPECT_EQ(unchanged.verdict.verdict, Verdict::recordedUnchanged);
    EXPECT_EQ(unchanged.times[static_cast<std::size_t>(StartPhase::load)], 0ns);
    EXPECT_GT(unchanged.times[static_cast<std::size_t>(StartPhase::check)], 0ns);
    EXPECT_LT(unchanged.total(), slow);
    for (const auto& [name, reason] :
         {std::pair(L"b", Verdict::recordedChanged), std::pair(L"c", Verdict::notRecorded)}) {
        const ProfiledLibrary& loaded = find(profile, name);
        EXPECT_TRUE(loaded.loaded);
        EXPECT_EQ(loaded.verdict.verdict, Verdict::works);
        ASSERT_TRUE(loaded.record);
        EXPECT_EQ(loaded.record->verdict, reason);
    }
    ASSERT_TRUE(profile.listReading && profile.initialize);
    EXPECT_GT(*profile.listReading, 0ns);

    wanted.list.clear();
    EXPECT_GE(*profileStart(wanted).initialize, *profile.initialize);
}

TEST_F(Profile, ExcludesALibraryThatTheListDoesNotHaveYet) {
    add(L"sleepsInInitialiser", L"a");
    add(L"goodWithKit", L"b");
    writeList();
    add(L"crashesInEntryPoint", L"c");
    ProfileOptions wanted = options();
    wanted.list = list();
    const StartProfile profile = profileStart(wanted);
    EXPECT_EQ(find(profile, L"c").verdict.verdict, Verdict::crashed);
    EXPECT_FALSE(find(profile, L"a").loaded);
    EXPECT_FALSE(find(profile, L"b").loaded);
    ASSERT_TRUE(profile.initialize);
    EXPECT_LT(*profile.initialize, slow);
    EXPECT_TRUE(profile.listReading);
}

TEST_F(Profile, ReportsAListThatCannotBeUsed) {
    add(L"goodWithKit");
    std::ofstream(list(), std::ios::binary) << "no list";
    ProfileOptions wanted = options();
    for (const auto& file : {list(), lists.path() / "missing"}) {
        wanted.list = file;
        const StartProfile profile = profileStart(wanted);
        EXPECT_THAT(profile.listProblem, HasSubstr(file.filename().wstring()));
        EXPECT_TRUE(find(profile, L"goodWithKit").loaded);
        EXPECT_FALSE(profile.listReading);
    }
}

TEST_F(Profile, OfAnEmptyOrMissingFolderFindsNoLibrary) {
    const StartProfile empty = profileStart(options());
    EXPECT_TRUE(empty.libraries.empty());
    EXPECT_TRUE(empty.leftOut.empty());
    EXPECT_TRUE(empty.initialize);
    EXPECT_THAT(answerOf(empty), HasSubstr(L"no library"));
    EXPECT_EQ(XmlCheck::faultIn(chartOf(empty)), "");

    ProfileOptions wanted = options();
    wanted.folders = {folder.path() / "missing"};
    const StartProfile missing = profileStart(wanted);
    EXPECT_TRUE(missing.libraries.empty());
    ASSERT_EQ(missing.leftOut.size(), 1u);
    EXPECT_EQ(missing.leftOut[0].finding.verdict, Verdict::missing);

    wanted.folders.clear();
    const StartProfile nowhere = profileStart(wanted);
    EXPECT_TRUE(nowhere.libraries.empty());
    EXPECT_FALSE(nowhere.initialize);
}

TEST_F(Profile, StopsWhenTheUserWants) {
    add(L"goodWithKit");
    ProfileOptions wanted = options();
    wanted.process.interrupted = [] { return true; };
    EXPECT_TRUE(profileStart(wanted).interrupted);
}

TEST_F(Profile, ReportsThatTheProcessCannotBeStarted) {
    add(L"goodWithKit");
    ProfileOptions wanted = options();
    wanted.process.program = folder.path() / "missing";
    EXPECT_THAT(profileStart(wanted).problem, HasSubstr(L"could not be started"));
}

TEST(ProfileText, IsForPeople) {
    EXPECT_EQ(timeText(0ns), L"0.000 ms");
    EXPECT_EQ(timeText(1234567ns), L"1.23 ms");
    EXPECT_EQ(timeText(123456789ns), L"123.5 ms");
    EXPECT_EQ(timeText(-2500us), L"-2.50 ms");
    EXPECT_EQ(shareText(0.876), L"88 %");
    EXPECT_EQ(shareText(0.034), L"3.4 %");
}

TEST(ProfileText, NamesNoShareOfAStartThatTookNoTime) {
    EXPECT_EQ(StartProfile().shareOf(ProfiledLibrary()), 0.0);
}

/// A profile with one library of each name. The first one is the slowest.
StartProfile profileOf(const std::vector<std::filesystem::path>& names) {
    StartProfile profile;
    for (const std::filesystem::path& name : names) {
        ProfiledLibrary library;
        library.path = name;
        library.verdict = {Verdict::works, L"1", {}};
        library.loaded = true;
        library.times = {1ms, 2ms, 30ms, 4ms, std::chrono::milliseconds(names.size())};
        profile.libraries.push_back(library);
    }
    profile.initialize = profile.sum() + 1ms;
    profile.runs = 5;
    return profile;
}

TEST(ProfileChart, IsWellFormedWhateverTheNamesAre) {
    std::setlocale(LC_ALL, "C.UTF-8");
    // The last one has a noncharacter, which is valid in file names and invalid in XML.
    const std::string chart = chartOf(profileOf({L"a<b>&\"c\".so", L"it's]]>.so", L"\x1B[31m\n.so",
                                                 pathOf("\xC3\xA4\xE2\x82\xAC\xEF\xBF\xBE.so")}));
    EXPECT_EQ(XmlCheck::faultIn(chart), "") << chart;
    EXPECT_THAT(chart, HasSubstr("a&lt;b&gt;&amp;&quot;c&quot;.so"));
    EXPECT_THAT(chart, HasSubstr("it&apos;s]]&gt;.so"));
    EXPECT_THAT(chart, HasSubstr("\\x1B[31m\\x0A.so"));
    EXPECT_THAT(chart, HasSubstr("\xC3\xA4\xE2\x82\xAC\xEF\xBF\xBD.so"));
    EXPECT_NE(XmlCheck::faultIn(chart + "<x>"), "");
}

TEST(ProfileChart, IsCompleteInItselfAndFitsLightAndDark) {
    std::string chart = chartOf(profileOf({L"first.so", L"second.so"}));
    EXPECT_THAT(chart, HasSubstr("prefers-color-scheme: dark"));
    const std::string name = "http://www.w3.org/2000/svg";
    const std::size_t found = chart.find(name);
    ASSERT_NE(found, std::string::npos);
    chart.erase(found, name.size());
    for (const char* reference : {"http", "href", "url(", "@import", "<script", "<image", "src="})
        EXPECT_THAT(chart, Not(HasSubstr(reference)));
}

TEST(ProfileChart, HasABarForEachLibraryAndPhase) {
    const std::string chart = chartOf(profileOf({L"first.so", L"second.so"}));
    EXPECT_LT(chart.find("first.so"), chart.find("second.so"));
    const std::string longest = "first.so, load with initialisers: 30.0 ms";
    EXPECT_THAT(chart, HasSubstr(longest));
    EXPECT_THAT(chart, HasSubstr("second.so, registration: 2.00 ms"));
    EXPECT_THAT(chart, HasSubstr("<text class=\"time\""));
    EXPECT_THAT(chart, HasSubstr("39.0 ms"));
}

TEST(ProfileChart, ShortensLongNamesAndLeavesOutWhatWasNotMeasured) {
    const std::string longest = "abcdefghijklmnopqrstuvwxyz0123456789"; // 36 characters.
    StartProfile profile = profileOf({longest, longest + ".so", "left.so"});
    profile.libraries[2].measured = false;
    const std::string chart = chartOf(profile);
    EXPECT_THAT(chart, HasSubstr(">" + longest + "<"));
    EXPECT_THAT(chart, HasSubstr(">" + longest.substr(0, 35) + "\xE2\x80\xA6<"));
    EXPECT_THAT(chart, Not(HasSubstr("left.so")));
}

TEST(ProfileChart, AddsUpTheLibrariesBehindTheFortieth) {
    std::vector<std::filesystem::path> names;
    for (int index = 0; index < 50; ++index)
        names.emplace_back(std::to_wstring(index) + L".so");
    const std::string chart = chartOf(profileOf(names));
    EXPECT_EQ(XmlCheck::faultIn(chart), "");
    EXPECT_THAT(chart, HasSubstr("11 others: 957.0 ms"));
    EXPECT_THAT(chart, HasSubstr("38.so"));
    EXPECT_THAT(chart, Not(HasSubstr("39.so")));
}

} // namespace
