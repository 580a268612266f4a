// SPDX-License-Identifier: BSL-1.0
// A process that is a copy of another one.
#include "components/componentManager/processControl.h"

#include <gtest/gtest.h>

#include <atomic>
#include <sys/wait.h>
#include <thread>
#include <unistd.h>

using namespace Mz;

namespace {

/// What `check` answers in a copy of this process.
template <class Check>
bool inCopy(Check&& check) {
    const pid_t child = ::fork();
    if (child == 0) {
        ::alarm(10); // Ends a copy that waits for ever.
        ::_exit(check() ? 0 : 1);
    }
    int status = 0;
    return ::waitpid(child, &status, 0) == child && WIFEXITED(status) && WEXITSTATUS(status) == 0;
}

TEST(Fork, GivesTheThreadAnIdentifierWithoutController) {
    QrProcessControl* const standard = QrGetProcessController();
    QrProcessControl* const own = reinterpret_cast<QrProcessControl*>(0x1234);
    QrSetThreadProcessController(own);
    EXPECT_EQ(QrGetProcessController(), own); // From now on it is remembered.
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
