// SPDX-License-Identifier: BSL-1.0
// Tests the registry of process controllers: the system's, each thread's, and many threads at once.
#include "components/componentManager/processControl.h"
#include "components/platform/platform.h"

#include <gtest/gtest.h>

#include <atomic>
#include <memory>
#include <thread>
#include <vector>

using namespace Mz;

namespace {

/// Counts the calls that take, release or destroy it.
class Controller : public QrCastImpl<Controller, QrProcessControl> {
  public:
    void* getContext() override { return nullptr; }
    void message(int, const wchar_t*) override {}
    bool isInterrupted() override { return false; }
    bool warning(int, const wchar_t*) override { return true; }
    bool isProgressShown() override { return false; }
    bool progress(float, const wchar_t*) override { return true; }
    bool isStatusShown() override { return false; }
    void status(const wchar_t*) override {}
    bool error(int, const wchar_t*) override { return false; }
    bool isErrorShown() override { return false; }
    void log(int, const wchar_t*) override {}
    [[noreturn]] void abort(int, const wchar_t*) override { throw 1; }
    std::wstring findFile(const wchar_t*, const wchar_t*, const wchar_t*) override { return {}; }

    long newReference() override { return ++touched; }
    long release() override { return ++touched; }
    void destroy() override { ++touched; }

    long touched = 0;
};

class ControllerRegistry : public testing::Test {
  protected:
    ~ControllerRegistry() override {
        QrSetThreadProcessController(nullptr);
        QrSetSystemProcessController(standard);
        for (const Controller* controller : {&a, &b})
            EXPECT_EQ(controller->touched, 0) << "the registry must not call its controllers";
    }
    QrProcessControl* const standard = QrGetSystemProcessController();
    Controller a;
    Controller b;
};

template <class Work>
void onAnotherThread(Work&& work) {
    std::thread(work).join();
}

TEST_F(ControllerRegistry, StartsWithTheDefaultControllerForEverybody) {
    EXPECT_NE(standard, nullptr);
    EXPECT_EQ(QrGetProcessController(), standard);
    EXPECT_EQ(QrGetThreadProcessController(), nullptr);
    onAnotherThread([&] {
        EXPECT_EQ(QrGetProcessController(), standard);
        EXPECT_EQ(QrGetThreadProcessController(), nullptr);
    });
}

TEST_F(ControllerRegistry, PrefersTheThreadsOwnController) {
    QrSetThreadProcessController(&a);
    EXPECT_EQ(QrGetProcessController(), &a);
    EXPECT_EQ(QrGetThreadProcessController(), &a);
    EXPECT_EQ(QrGetSystemProcessController(), standard);
    QrSetThreadProcessController(nullptr);
    EXPECT_EQ(QrGetProcessController(), standard);
    EXPECT_EQ(QrGetThreadProcessController(), nullptr);
}

TEST_F(ControllerRegistry, KeepsThreadsApart) {
    QrSetThreadProcessController(&a);
    onAnotherThread([&] {
        EXPECT_EQ(QrGetProcessController(), standard);
        QrSetThreadProcessController(&b);
        EXPECT_EQ(QrGetProcessController(), &b);
        QrSetThreadProcessController(nullptr);
        EXPECT_EQ(QrGetProcessController(), standard);
    });
    EXPECT_EQ(QrGetProcessController(), &a);
}

TEST_F(ControllerRegistry, ReplacesAThreadsController) {
    QrSetThreadProcessController(&a);
    QrSetThreadProcessController(&b);
    EXPECT_EQ(QrGetThreadProcessController(), &b);
    QrSetThreadProcessController(nullptr);
    EXPECT_EQ(QrGetThreadProcessController(), nullptr) << "an earlier controller is not restored";
}

TEST_F(ControllerRegistry, RemovalWithoutAnEntryChangesNothing) {
    QrSetThreadProcessController(nullptr);
    EXPECT_EQ(QrGetProcessController(), standard);
    QrSetThreadProcessController(&a);
    onAnotherThread([] { QrSetThreadProcessController(nullptr); });
    EXPECT_EQ(QrGetProcessController(), &a);
}

TEST_F(ControllerRegistry, ReplacesTheSystemControllerForThreadsWithoutTheirOwn) {
    QrSetThreadProcessController(&a);
    QrSetSystemProcessController(&b);
    EXPECT_EQ(QrGetSystemProcessController(), &b);
    EXPECT_EQ(QrGetProcessController(), &a);
    onAnotherThread([&] { EXPECT_EQ(QrGetProcessController(), &b); });
}

TEST_F(ControllerRegistry, TakesANullSystemControllerAsItIs) {
    QrSetSystemProcessController(nullptr);
    EXPECT_EQ(QrGetSystemProcessController(), nullptr);
    EXPECT_EQ(QrGetProcessController(), nullptr);
    EXPECT_THROW(safeCast<QrProcessControl>(QrGetProcessController()),
                 QrComponentManagerEx::ExBadCast);
    QrSetThreadProcessController(&a);
    EXPECT_EQ(QrGetProcessController(), &a);
}

TEST_F(ControllerRegistry, NeverLooksAtWhatItIsGiven) {
    alignas(QrProcessControl) static char noController[sizeof(QrProcessControl)] = {};
    auto* const dangling = reinterpret_cast<QrProcessControl*>(noController);
    QrSetThreadProcessController(dangling);
    EXPECT_EQ(QrGetProcessController(), dangling);
    QrSetThreadProcessController(&a);
    QrSetSystemProcessController(dangling);
    EXPECT_EQ(QrGetSystemProcessController(), dangling);
}

/// The system reuses the identifiers of ended threads. A thread finds the entry that an ended
/// thread with its identifier left.
TEST_F(ControllerRegistry, LeavesTheEntryOfAnEndedThreadToTheNextWithItsIdentifier) {
    std::uint32_t first = 0;
    onAnotherThread([&] {
        first = platform::currentThreadId();
        QrSetThreadProcessController(&a);
    });
    bool seenAgain = false;
    // Enough threads for the system to reuse every identifier.
    constexpr int largestRound = 70000;
    for (int attempt = 0; attempt < largestRound && !seenAgain; ++attempt)
        onAnotherThread([&] {
            if (platform::currentThreadId() == first) {
                seenAgain = true;
                EXPECT_EQ(QrGetProcessController(), &a);
                EXPECT_EQ(QrGetThreadProcessController(), &a);
                QrSetThreadProcessController(nullptr);
                EXPECT_EQ(QrGetProcessController(), standard);
            }
        });
    if (!seenAgain)
        GTEST_SKIP() << "the system did not reuse the identifier";
}

TEST_F(ControllerRegistry, ServesManyThreadsAtOnce) {
    constexpr int threadCount = 8;
    constexpr int rounds = 3000;
    std::atomic<int> ready = 0;
    std::atomic<int> mistakes = 0;
    std::vector<std::unique_ptr<Controller>> controllers;
    std::vector<std::thread> threads;
    for (int index = 0; index < threadCount; ++index) {
        Controller* const own = controllers.emplace_back(std::make_unique<Controller>()).get();
        threads.emplace_back([&, own] {
            ++ready;
            while (ready != threadCount)
                std::this_thread::yield();
            for (int round = 0; round < rounds; ++round) {
                QrSetThreadProcessController(own);
                mistakes += QrGetProcessController() != own;
                mistakes += QrGetThreadProcessController() != own;
                QrSetThreadProcessController(nullptr);
                mistakes += QrGetProcessController() != standard;
                mistakes += QrGetThreadProcessController() != nullptr;
            }
        });
    }
    for (std::thread& thread : threads)
        thread.join();
    EXPECT_EQ(mistakes, 0);
}

TEST_F(ControllerRegistry, KeepsTheControllersOfManyThreadsThatAreAliveAtOnce) {
    constexpr int threadCount = 40;
    std::atomic<int> set = 0;
    std::atomic<int> mistakes = 0;
    std::vector<std::unique_ptr<Controller>> controllers;
    std::vector<std::thread> threads;
    for (int index = 0; index < threadCount; ++index) {
        Controller* const own = controllers.emplace_back(std::make_unique<Controller>()).get();
        threads.emplace_back([&, own] {
            QrSetThreadProcessController(own);
            ++set;
            while (set != threadCount)
                std::this_thread::yield();
            mistakes += QrGetProcessController() != own;
            QrSetThreadProcessController(nullptr);
        });
    }
    for (std::thread& thread : threads)
        thread.join();
    EXPECT_EQ(mistakes, 0);
    EXPECT_EQ(QrGetProcessController(), standard);
}

struct EarlyUse {
    QrProcessControl* const found = QrGetProcessController();
    ~EarlyUse() {
        if (QrGetProcessController() != found)
            std::abort();
    }
};

EarlyUse earlyUse;

TEST_F(ControllerRegistry, WorksDuringStaticConstructionAndDestruction) {
    EXPECT_EQ(earlyUse.found, standard);
}

} // namespace
