// SPDX-License-Identifier: BSL-1.0
/// Tests what a profile makes of the answers of its processes. A script takes the place of the
/// probe.
#include "components/componentTools/profiling/profileMessages.h"
#include "tests/tools/toolsFixture.h"

#include <chrono>
#include <fstream>
#include <string>

using namespace Mz;
using namespace Mz::Tools;
using namespace Mz::Test;
using namespace std::chrono_literals;
using ::testing::HasSubstr;

namespace {

/// Answers with the file "whole" if `initialize` is to be measured, else with "steps". The files
/// "steps.first" and so on are the answers to the first requests.
constexpr const char* script = R"(#!/bin/sh
cd "${0%/*}"
case "$3" in
*'"whole":true'*) exec cat whole ;;
*) for answer in first second; do
       [ -e steps.$answer ] || continue
       cat steps.$answer
       exec rm steps.$answer
   done
   exec cat steps ;;
esac
)";

class ProfileProcess : public testing::Test {
  protected:
    ProfileProcess() {
        wanted.folders = {folder.path()};
        wanted.runs = 1;
        wanted.process.timeLimit = 60s;
        wanted.process.program = answers.write("probe", script);
        std::filesystem::permissions(wanted.process.program, std::filesystem::perms::owner_all);
        folder.write("library", "not read");
        answer("steps", stepsIn(4ms) + encodeListing(1ms));
        answer("whole", encodeWhole(std::nullopt, 9ms));
    }

    void answer(const char* request, const std::string& bytes) const {
        answers.write(request, bytes);
    }

    static std::string stepsIn(std::chrono::nanoseconds time, Verdict verdict = Verdict::works) {
        return encodeLibraryBegin(0) +
               encodeSteps({0, {time, 0ns, 0ns, 0ns, 0ns}, {verdict, L"1", {}}});
    }

    StartProfile profile() const { return profileStart(wanted); }

    ProfileOptions wanted;
    TemporaryDirectory folder, answers;
};

TEST_F(ProfileProcess, IsRepeatedAndItsMediansCount) {
    wanted.runs = 2;
    // The first turn fills the file cache, and does not count.
    answer("steps.first", stepsIn(100ms) + encodeListing(1ms));
    answer("steps.second", stepsIn(6ms) + encodeListing(2ms));
    const StartProfile result = profile();
    EXPECT_EQ(result.problem, L"");
    EXPECT_EQ(result.runs, 2);
    ASSERT_EQ(result.libraries.size(), 1u);
    EXPECT_EQ(result.libraries[0].total(), 5ms); // The mean of 4 and 6.
    EXPECT_EQ(result.listing, 1500us);
    EXPECT_EQ(result.initialize, 9ms);
}

TEST_F(ProfileProcess, ExcludesTheLibraryThatHasBegunWhenItsReportIsInvalid) {
    answer("steps.first", encodeLibraryBegin(0) + "foreign bytes");
    const StartProfile result = profile();
    EXPECT_EQ(result.problem, L"");
    ASSERT_EQ(result.libraries.size(), 1u);
    EXPECT_EQ(result.libraries[0].path, folder.path() / "library");
    EXPECT_EQ(result.runs, 1);
}

TEST_F(ProfileProcess, IsNotBelievedIfSomethingFollowsItsLastMessage) {
    answer("steps", encodeListing(1ms) + "foreign bytes");
    EXPECT_THAT(profile().problem, HasSubstr(L"the process of the measurement ended early: "));
}

TEST_F(ProfileProcess, EndsTheMeasurementIfItEndsBeforeALibrary) {
    answer("steps", "");
    const StartProfile result = profile();
    EXPECT_THAT(result.problem, HasSubstr(L"the process of the measurement ended early: "));
    EXPECT_TRUE(result.libraries.empty());
    EXPECT_FALSE(result.initialize);
}

TEST_F(ProfileProcess, EndsTheMeasurementIfTheFoldersChanged) {
    answer("steps", encodeOtherFolders());
    EXPECT_EQ(profile().problem, L"the folders changed during the measurement. Repeat it");
    answer("steps", stepsIn(4ms) + encodeListing(1ms));
    answer("whole", encodeOtherFolders());
    const StartProfile result = profile();
    EXPECT_EQ(result.problem, L"the folders changed during the measurement. Repeat it");
    EXPECT_EQ(result.runs, 0);
}

TEST_F(ProfileProcess, ReportsThatInitializeCouldNotBeMeasured) {
    for (const std::string& invalid : {std::string(), encodeWhole(1ms, 9ms) + "foreign bytes"}) {
        answer("whole", invalid);
        const StartProfile result = profile();
        EXPECT_THAT(result.problem, HasSubstr(L"initialize could not be measured: "));
        EXPECT_FALSE(result.initialize);
        EXPECT_FALSE(result.listReading);
        EXPECT_EQ(result.libraries.size(), 1u);
    }
}

TEST_F(ProfileProcess, IsKilledWhenTheUserWants) {
    int polls = 0;
    wanted.process.interrupted = [&] { return ++polls > 1; };
    answers.write("probe", "#!/bin/sh\nexec sleep 60\n");
    const StartProfile result = profile();
    EXPECT_TRUE(result.interrupted);
    EXPECT_EQ(result.problem, L"");
    EXPECT_EQ(result.runs, 0);
    EXPECT_FALSE(hasChildProcess());
}

TEST_F(ProfileProcess, HasMeasuredLibrariesWhenTheUserStopsItLater) {
    // A library with this verdict would be examined again, for its reason.
    answer("steps", stepsIn(4ms, Verdict::loadFailed) + encodeListing(1ms));
    answer("whole", encodeWhole(std::nullopt, 9ms) + std::string());
    wanted.process.interrupted = [&] { return std::filesystem::exists(answers.path() / "stop"); };
    answers.write("probe",
                  std::string(script).insert(std::strlen("#!/bin/sh\n"),
                                             "case \"$3\" in *'\"whole\":true'*) "
                                             ": > \"${0%/*}/stop\"; exec sleep 60;; esac\n"));
    const StartProfile result = profile();
    EXPECT_TRUE(result.interrupted);
    ASSERT_EQ(result.libraries.size(), 1u);
    EXPECT_EQ(result.libraries[0].verdict.verdict, Verdict::loadFailed);
    EXPECT_EQ(result.libraries[0].total(), 4ms);
}

} // namespace
