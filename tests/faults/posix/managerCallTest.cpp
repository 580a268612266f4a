// SPDX-License-Identifier: BSL-1.0
/// Tests the component manager while calls of the system fail: what one start cannot read, the next
/// one reads, and nothing that was recorded is lost.
#include "tests/faults/managerFaultFixture.h"
#include "tests/support/failingCalls.h"
#include "tests/support/signalStorm.h"

#include <cerrno>
#include <cstddef>
#include <fcntl.h>
#include <iterator>
#include <linux/filter.h>
#include <linux/seccomp.h>
#include <sys/mman.h>
#include <sys/prctl.h>
#include <sys/syscall.h>
#include <thread>

using namespace Mz;
using namespace Mz::Test;
using ::testing::IsSupersetOf;

namespace {

class ManagerWithFailingCalls : public ManagerFaultTest, public ::testing::WithParamInterface<int> {
  protected:
    const std::wstring path = searchPathOf(folder.path());
};

TEST_P(ManagerWithFailingCalls, HasAllBuildersInTheNextStart) {
    const int failures = failEachCall(GetParam(), [&](CallAttempt& attempt) {
        restart();
        attempt.run([&] { manager->initialize(path.c_str()); });
        EXPECT_THAT(all, IsSupersetOf(names())) << attempt.failed;
        if (GetParam() == EINTR && attempt.failed == "pread") {
            EXPECT_EQ(names(), all) << "an interrupted read goes on";
        }
        restartWithList();
        EXPECT_EQ(names(), all) << attempt.failed;
        restart();
    });
    EXPECT_GE(failures, 12);
}

TEST_P(ManagerWithFailingCalls, LosesNothingOfTheRecordedList) {
    const std::string whole = wholeList(), partial = listWithoutFirst();
    for (const std::string& recorded : {whole, partial}) {
        const int failures = failEachCall(GetParam(), [&](CallAttempt& attempt) {
            restart();
            read(recorded);
            attempt.run([&] { manager->initialize(path.c_str()); });
            restartWithList();
            EXPECT_EQ(names(), recorded == whole ? all : Names{L"gamma"}) << attempt.failed;
            restart();
        });
        EXPECT_GE(failures, 6);
    }
}

TEST_P(ManagerWithFailingCalls, CreatesTheObjectInTheNextStart) {
    const std::string recorded = wholeList();
    const int failures = failEachCall(GetParam(), [&](CallAttempt& attempt) {
        restart();
        read(recorded);
        initialize();
        attempt.run([&] { static_cast<void>(manager->createObject(recordedGamma)); });
        restartWithList();
        EXPECT_TRUE(manager->createObject(recordedGamma)) << attempt.failed;
        EXPECT_EQ(names(), all) << attempt.failed;
        restart();
    });
    EXPECT_GE(failures, 4);
}

INSTANTIATE_TEST_SUITE_P(, ManagerWithFailingCalls,
                         ::testing::Values(EIO, EINTR, EMFILE, ENFILE, ENOMEM));

using ManagerUnderSignals = ManagerFaultTest;

TEST_F(ManagerUnderSignals, FindsTheSame) {
    const std::string recorded = wholeList();
    underSignals(200, [&] {
        restart();
        initialize();
        EXPECT_EQ(list(), recorded);
        EXPECT_TRUE(manager->createObject(recordedGamma));
        restartWithList();
        EXPECT_EQ(list(), recorded);
    });
}

using ManagerWithShortReads = ManagerFaultTest;

TEST_F(ManagerWithShortReads, FindsTheSame) {
    const std::string recorded = wholeList();
    const ShortTransfers shortened;
    initialize();
    EXPECT_EQ(names(), all);
    EXPECT_EQ(list(), recorded);
}

/// A system call of the loader and the error with which it fails. The third argument of the call
/// distinguishes it from those of the manager.
struct LoaderFailure {
    unsigned int call, argument, mask;
    unsigned int error;
};

/// Lets that call fail in this thread. Returns false if this process may not do that.
bool refuse(const LoaderFailure& failure) {
    sock_filter code[] = {
        BPF_STMT(BPF_LD | BPF_W | BPF_ABS, offsetof(seccomp_data, nr)),
        BPF_JUMP(BPF_JMP | BPF_JEQ | BPF_K, failure.call, 0, 4),
        BPF_STMT(BPF_LD | BPF_W | BPF_ABS, offsetof(seccomp_data, args[2])),
        BPF_STMT(BPF_ALU | BPF_AND | BPF_K, failure.mask),
        BPF_JUMP(BPF_JMP | BPF_JEQ | BPF_K, failure.argument, 0, 1),
        BPF_STMT(BPF_RET | BPF_K, SECCOMP_RET_ERRNO | failure.error),
        BPF_STMT(BPF_RET | BPF_K, SECCOMP_RET_ALLOW),
    };
    const sock_fprog program{std::size(code), code};
    return ::prctl(PR_SET_NO_NEW_PRIVS, 1, 0, 0, 0) == 0 &&
           ::prctl(PR_SET_SECCOMP, SECCOMP_MODE_FILTER, &program) == 0;
}

class ManagerWithFailingLoader : public ManagerFaultTest,
                                 public ::testing::WithParamInterface<LoaderFailure> {};

TEST_P(ManagerWithFailingLoader, TriesTheLibrariesAgain) {
    const std::string recorded = wholeList();
    for (const bool withList : {false, true}) {
        restart();
        if (withList)
            read(recorded);
        bool refused = false;
        // A thread for the test, because the refusal lasts as long as its thread.
        std::thread([&] {
            refused = refuse(GetParam());
            if (!refused)
                return;
            initialize();
            EXPECT_FALSE(manager->createObject(recordedGamma));
        }).join();
        if (!refused)
            GTEST_SKIP() << "this process may not filter system calls";
        restartWithList();
        EXPECT_EQ(names(), all);
        EXPECT_TRUE(manager->createObject(recordedGamma));
    }
}

INSTANTIATE_TEST_SUITE_P(, ManagerWithFailingLoader,
                         ::testing::Values(LoaderFailure{SYS_mmap, PROT_EXEC, PROT_EXEC, ENOMEM},
                                           LoaderFailure{SYS_openat, O_CLOEXEC,
                                                         O_CLOEXEC | O_NONBLOCK, EMFILE}));

} // namespace
