// SPDX-License-Identifier: BSL-1.0
// Searches for the components with which a host fails, with a host that is started.
#include "components/componentTools/bisect.h"
#include "components/componentTools/console.h"
#include "components/componentTools/disabled.h"
#include "tests/tools/toolsFixture.h"

#include <cstdlib>
#include <map>
#include <sstream>
#include <utility>

using namespace Mz;
using namespace Mz::Tools;
using namespace Mz::Test;
using ::testing::ElementsAre;
using ::testing::HasSubstr;
using State = BisectResult::State;

namespace {

class Bisect : public ToolsTest {
  protected:
    Bisect() {
        options.folders = {folder.path()};
        options.list = work.path() / "list";
        options.host = buildFolder / "bin" / "bisectHost";
        options.arguments = {work.path() / "own list", folder.path()};
        options.probe = patient();
    }

    /// Copies good components until there are `count` components.
    void fill(std::size_t count) {
        std::size_t present = 0;
        for (const auto& entry : std::filesystem::directory_iterator(folder.path()))
            present += entry.is_regular_file();
        for (std::size_t index = 0; index + present < count; ++index) {
            const auto file =
                builtComponent(L"numbered" + std::to_wstring(10 + index % 30), L"numbered");
            std::filesystem::copy_file(file, folder.path() / ("good" + std::to_string(index)));
        }
    }

    static std::vector<std::string> names(const BisectResult& result) {
        std::vector<std::string> all;
        for (const Culprit& culprit : result.culprits)
            all.push_back(culprit.path.filename().string());
        return all;
    }

    BisectOptions options;
    TemporaryDirectory work;
};

TEST_F(Bisect, FindsTheCulpritAmong64ComponentsByAtMostEightStarts) {
    add(L"failsAlone", "good2x"); // Amid the others.
    fill(64);
    const BisectResult result = bisect(options);
    EXPECT_EQ(result.state, State::found);
    EXPECT_THAT(names(result), ElementsAre("good2x"));
    EXPECT_EQ(result.components, 64u);
    EXPECT_LE(result.starts, 8);
    EXPECT_GE(result.failures, 2);
    EXPECT_THAT(result.ending, HasSubstr(L"crash: "));
    EXPECT_EQ(result.culprits.at(0).verdict.verdict, Verdict::works);
    EXPECT_THAT(result.culprits.at(0).stamp, HasSubstr(L"SOVERSION"));
    EXPECT_EQ(result.culprits.at(0).record.builders.size(), 1u);
}

TEST_F(Bisect, FindsThePairAmong64ComponentsThatOnlyFailsTogetherByAtMostFortyStarts) {
    add(L"failsWithSecond", "aaa");
    add(L"failsWithFirst", "good5x");
    fill(64);
    const BisectResult result = bisect(options);
    EXPECT_EQ(result.state, State::found);
    EXPECT_THAT(names(result), ElementsAre("aaa", "good5x"));
    EXPECT_LE(result.starts, 40);
    EXPECT_EQ(result.ending, L"exit status 7");
}

TEST_F(Bisect, FindsTheCulpritThatFailsInThirtyPercentOfTheStarts) {
    add(L"failsSometimes", "good3x");
    fill(64);
    options.arguments.push_back(work.path() / "counter");
    options.repeat = 10; // The test's component fails three times in ten starts, in a fixed order.
    const BisectResult result = bisect(options);
    EXPECT_EQ(result.state, State::found);
    EXPECT_THAT(names(result), ElementsAre("good3x"));
}

TEST_F(Bisect, GoesOnWhereAHostWouldOfferItsSafeMode) {
    add(L"failsAlone", "bad");
    fill(5);
    options.host = buildFolder / "bin" / "startHost";
    options.arguments.push_back("mode=changed"); // Would leave out the culprit after a crash.
    const BisectResult result = bisect(options);
    EXPECT_EQ(result.state, State::found);
    EXPECT_THAT(names(result), ElementsAre("bad"));
    EXPECT_FALSE(std::filesystem::exists(work.path() / "own list"));
}

TEST_F(Bisect, ReplacesTheListThatItsOwnEnvironmentNames) {
    add(L"failsAlone", "bad");
    fill(2);
    const auto other = work.path() / "other list";
    setEnvironment("MZ_COMPONENT_LIST", other.string());
    EXPECT_THAT(names(bisect(options)), ElementsAre("bad"));
    EXPECT_FALSE(std::filesystem::exists(other));
}

TEST_F(Bisect, CountsAHostThatHangsAsFailed) {
    add(L"failsByHanging", "bad");
    options.timeLimit = std::chrono::seconds(10);
    const BisectResult result = bisect(options);
    EXPECT_EQ(result.state, State::found);
    EXPECT_THAT(names(result), ElementsAre("bad"));
    EXPECT_EQ(result.ending, L"still running at the time limit");
}

TEST_F(Bisect, CountsAHostThatStillRunsAsGoodIfTold) {
    add(L"failsByHanging", "quiet");
    options.timeLimit = std::chrono::seconds(1);
    options.runningIsGood = true;
    EXPECT_EQ(bisect(options).state, State::allPass);
}

TEST_F(Bisect, AsksWhetherAStartFailed) {
    fill(8);
    int asked = 0;
    options.judge = [&](const HostStart& start) {
        EXPECT_EQ(start.number, ++asked);
        EXPECT_FALSE(start.failed);
        EXPECT_EQ(start.ending, L"exit status 0");
        return std::optional(start.active > 3); // Four of them together.
    };
    EXPECT_EQ(bisect(options).culprits.size(), 4u);
    options.judge = [](const HostStart&) { return std::optional<bool>(); };
    const BisectResult stopped = bisect(options);
    EXPECT_EQ(stopped.state, State::stopped);
    EXPECT_EQ(stopped.starts, 1);
}

TEST_F(Bisect, SaysThatTheHostFailsWithoutComponents) {
    fill(2);
    options.arguments.clear();
    const BisectResult result = bisect(options);
    EXPECT_EQ(result.state, State::noneFails);
    EXPECT_THAT(result.culprits, ::testing::IsEmpty());
    EXPECT_EQ(result.ending, L"exit status 64");
}

TEST_F(Bisect, SaysThatTheHostCannotBeStarted) {
    fill(2);
    options.host = work.path() / "absent";
    const BisectResult result = bisect(options);
    EXPECT_EQ(result.state, State::notStarted);
    EXPECT_THAT(result.problem, HasSubstr(L"absent"));
    EXPECT_EQ(result.starts, 0);
}

TEST_F(Bisect, FindsTheHostInPath) {
    fill(1);
    const std::wstring extension = MZ_PROGRAM_EXTENSION;
    const std::filesystem::path name = "search.host";
    std::filesystem::copy_file(options.host.wstring() + extension,
                               work.path() / (name.wstring() + extension));
    const std::string separator{std::filesystem::path::preferred_separator == '/' ? ":" : ";"};
    const char* const before = std::getenv("PATH");
    setEnvironment("PATH", work.path().string() + separator + // The other is for libraries.
                               (buildFolder / "bin").string() + separator + (before ? before : ""));
    options.host = name;
    const BisectResult result = bisect(options);
    EXPECT_EQ(result.state, State::allPass) << std::filesystem::path(result.problem);
    EXPECT_EQ(result.starts, 1);
    options.host = "no.host";
    EXPECT_EQ(bisect(options).state, State::notStarted);
}

TEST_F(Bisect, PassesOnTheOutputOfTheHostAndChangesNoListOfItsOwn) {
    fill(3);
    std::string output;
    options.output = [&](std::string_view piece) { output += piece; };
    EXPECT_EQ(bisect(options).state, State::allPass);
    EXPECT_THAT(output, ::testing::StartsWith("3 made"));
    EXPECT_FALSE(std::filesystem::exists(work.path() / "own list"));
    const std::string before = contentOf(options.list);
    bisect(options);
    EXPECT_EQ(contentOf(options.list), before);
}

TEST_F(Bisect, LeavesOffWhatTheUserSwitchedOff) {
    const auto file = add(L"failsAlone", "bad");
    fill(3);
    EXPECT_EQ(disableComponent(file, options.list).problem, L"");
    const BisectResult result = bisect(options);
    EXPECT_EQ(result.state, State::allPass);
    EXPECT_EQ(result.components, 2u);
    EXPECT_EQ(disabledComponents(options.list).size(), 1u);
}

TEST_F(Bisect, SwitchesOffALibraryThatNeedsItsHost) {
    add(L"takesFromHost", "needs");
    fill(2);
    options.host = buildFolder / "bin" / "recordedHost";
    std::string output;
    options.output = [&](std::string_view piece) { output += piece; };
    std::map<std::size_t, std::string> outputs; // By the number of active components.
    options.judge = [&](const HostStart& start) {
        std::erase(output, '\r');
        outputs[start.active] = std::exchange(output, {});
        return std::optional(true); // Until no component is left.
    };
    const BisectResult result = bisect(options);
    EXPECT_EQ(result.state, State::noneFails);
    EXPECT_EQ(result.components, 2u);
    EXPECT_THAT(outputs[2], HasSubstr("\n2 made\n"));
    EXPECT_EQ(outputs[0], "0 builders, 0 mapped, no word\n0 made\n");
}

TEST_F(Bisect, ShowsTheProgressOfItsScan) {
    fill(1);
    std::ostringstream shown;
    ConsoleController controller(shown, false);
    options.controller = &controller;
    bisect(options);
    EXPECT_THAT(shown.str(), ::testing::StartsWith("0% good0\n"));
}

TEST_F(Bisect, StopsBeforeTheFirstStartIfTheScanIsInterrupted) {
    fill(2);
    options.probe.interrupted = [&] { return !std::filesystem::exists(options.list); };
    options.judge = [](const HostStart&) -> std::optional<bool> {
        ADD_FAILURE() << "started";
        return true;
    };
    const BisectResult result = bisect(options);
    EXPECT_EQ(result.state, State::stopped);
    EXPECT_TRUE(result.scanned.interrupted);
    EXPECT_EQ(result.starts, 0);
}

TEST_F(Bisect, CountsNoStartThatTheUserInterrupts) {
    add(L"failsByHanging", "bad");
    int asked = 0; // Since the scan has ended: before the start, and while the host hangs.
    options.probe.interrupted = [&] {
        return std::filesystem::exists(verdictsFileOf(options.list)) && ++asked > 1;
    };
    const BisectResult result = bisect(options);
    EXPECT_EQ(result.state, State::stopped);
    EXPECT_FALSE(result.scanned.interrupted);
    EXPECT_EQ(result.starts, 0);
    EXPECT_EQ(result.failures, 0);
    EXPECT_TRUE(result.culprits.empty());
}

TEST_F(Bisect, StopsWhenTheUserWants) {
    add(L"failsAlone", "bad");
    fill(8);
    int starts = 0;
    options.started = [&](const HostStart&) { ++starts; };
    options.probe.interrupted = [&] { return starts == 2; };
    const BisectResult result = bisect(options);
    EXPECT_EQ(result.state, State::stopped);
    EXPECT_EQ(result.starts, 2);
    EXPECT_FALSE(result.culprits.empty()); // The smallest set so far.
}

} // namespace
