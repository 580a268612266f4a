// SPDX-License-Identifier: BSL-1.0
// Tests the controller registry in a forked child.
#include "components/componentManager/processControl.h"

#include <gtest/gtest.h>

#include <atomic>
#include <sys/wait.h>
#include <thread>
#include <unistd.h>

using namespace Mz;

namespace {

/// Forks and returns what `check` returns in the child.
template <class Check>
bool inCopy(Check&& check) {
    const pid_t child = ::fork();
    if (child == 0) {
        ::alarm(10); // Ends a child that deadlocks.
        ::_exit(check() ? 0 : 1);
    }
    int status = 0;
    return ::waitpid(child, &status, 0) == child && WIFEXITED(status) && WEXITSTATUS(status) == 0;
}

TEST(Fork, GivesTheThreadAnIdentifierWithoutController) {
    QrProcessControl* const standard = QrGetProcessController();
    QrProcessControl* const own = reinterpret_cast<QrProcessControl*>(0x1234);
    QrSetThreadProcessController(own);
    EXPECT_EQ(QrGetProcessController(), own); // Now it is cached.
    EXPECT_TRUE(inCopy([&] {
        return QrGetThreadProcessController() == nullptr && QrGetProcessController() == standard;
    }));
    EXPECT_EQ(QrGetProcessController(), own);
    QrSetThreadProcessController(nullptr);
}

TEST(Fork, NeverCopiesALockThatNobodyGivesBack) {
    std::atomic<bool> done = false;
    std::thread busy([&] {
        QrProcessControl* const own = reinterpret_cast<QrProcessControl*>(0x1234);
        while (!done) {
            QrSetThreadProcessController(own);
            QrSetThreadProcessController(nullptr);
        }
    });
    int good = 0;
    for (int round = 0; round < 50; ++round)
        good += inCopy([] {
            QrSetThreadProcessController(reinterpret_cast<QrProcessControl*>(0x5678));
            return QrGetThreadProcessController() != nullptr;
        });
    done = true;
    busy.join();
    EXPECT_EQ(good, 50);
}

} // namespace
