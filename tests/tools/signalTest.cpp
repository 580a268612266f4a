// SPDX-License-Identifier: BSL-1.0
/// Tests hosts that ignore SIGCHLD, on systems that have that signal.
#include "tests/tools/toolsFixture.h"

#include <csignal>

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

} // namespace
