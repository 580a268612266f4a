// SPDX-License-Identifier: BSL-1.0
/// Tests guarded imports of hosts that ignore SIGCHLD, and so do not learn how a process ended.
#include "tests/guarding/guardingFixture.h"

#include <csignal>

using namespace Mz;
using namespace Mz::Test;
using Kit::ImportVerdict;

namespace {

class GuardingInAHostThatIgnoresChildren : public Guarding {
  protected:
    GuardingInAHostThatIgnoresChildren() : previous(std::signal(SIGCHLD, SIG_IGN)) {}
    ~GuardingInAHostThatIgnoresChildren() override { std::signal(SIGCHLD, previous); }

  private:
    void (*previous)(int);
};

TEST_F(GuardingInAHostThatIgnoresChildren, SaysThatTheAnswerIsLost) {
    const Kit::GuardedImport import = this->import("importing crash");
    EXPECT_EQ(import.verdict, ImportVerdict::answerLost);
    EXPECT_EQ(import.activity, L"the import by \"Hostile\"");
}

TEST_F(GuardingInAHostThatIgnoresChildren, BelievesAWholeAnswer) {
    EXPECT_EQ(import("importing null").verdict, ImportVerdict::gaveNothing);
}

} // namespace
