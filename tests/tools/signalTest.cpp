// SPDX-License-Identifier: BSL-1.0
/// Tests hosts that ignore SIGCHLD, on systems that have that signal.
#include "components/componentTools/bisect.h"
#include "tests/tools/toolsFixture.h"

#include <csignal>
#include <optional>

using namespace Mz;
using namespace Mz::Tools;
using namespace Mz::Test;

namespace {

class ExplainInAHostThatIgnoresChildren : public ToolsTest {
  protected:
    ExplainInAHostThatIgnoresChildren() : previous(std::signal(SIGCHLD, SIG_IGN)) {}
    ~ExplainInAHostThatIgnoresChildren() override { std::signal(SIGCHLD, previous); }

    Verdict verdictOn(const std::wstring& component) {
        ExplainOptions options;
        options.load = true;
        options.probe = patient();
        return explainFile(add(component), options).verdict.verdict;
    }

  private:
    void (*previous)(int);
};

TEST_F(ExplainInAHostThatIgnoresChildren, TakesNoCrashForAnEndByItself) {
    EXPECT_EQ(verdictOn(L"crashesInEntryPoint"), Verdict::endUnknown);
    EXPECT_EQ(verdictOn(L"exits"), Verdict::endUnknown);
}

TEST_F(ExplainInAHostThatIgnoresChildren, BelievesAWholeAnswer) {
    EXPECT_EQ(verdictOn(L"goodWithKit"), Verdict::works);
    EXPECT_EQ(verdictOn(L"throwsInEntryPoint"), Verdict::threw);
}

class BisectInAHostThatIgnoresChildren : public ExplainInAHostThatIgnoresChildren {
  protected:
    BisectInAHostThatIgnoresChildren() {
        add(L"goodWithKit");
        options.folders = {folder.path()};
        options.host = buildFolder / "bin" / "bisectHost";
        options.arguments = {folder.path() / "own list", folder.path()};
        options.probe = patient();
    }

    BisectOptions options;
};

TEST_F(BisectInAHostThatIgnoresChildren, SaysThatItCannotTellHowTheHostEnds) {
    const BisectResult result = bisect(options);
    EXPECT_EQ(result.state, BisectResult::State::notStarted);
    EXPECT_EQ(result.problem, L"its exit status is not available. Do not ignore SIGCHLD in the "
                              L"program that starts it");
    EXPECT_EQ(result.failures, 0);
}

TEST_F(BisectInAHostThatIgnoresChildren, LeavesTheJudgementToTheUser) {
    options.judge = [](const HostStart& start) {
        EXPECT_EQ(start.ending, L"unknown end");
        return std::optional(false);
    };
    const BisectResult result = bisect(options);
    EXPECT_EQ(result.state, BisectResult::State::allPass);
    EXPECT_EQ(result.starts, 1);
}

} // namespace
