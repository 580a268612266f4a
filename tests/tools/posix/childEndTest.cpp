// SPDX-License-Identifier: BSL-1.0
/// Tests the end of probes on a system that cannot report it, as before Linux 5.3.
#include "tests/tools/toolsFixture.h"

#include <cerrno>
#include <cstddef>
#include <linux/filter.h>
#include <linux/seccomp.h>
#include <sys/prctl.h>
#include <sys/syscall.h>
#include <thread>
#include <unistd.h>

using namespace Mz;
using namespace Mz::Tools;
using namespace Mz::Test;

namespace {

/// Lets this system call fail in this thread and in the processes that it starts.
bool refuse(unsigned int call) {
    sock_filter code[] = {
        BPF_STMT(BPF_LD | BPF_W | BPF_ABS, offsetof(seccomp_data, nr)),
        BPF_JUMP(BPF_JMP | BPF_JEQ | BPF_K, call, 0, 1),
        BPF_STMT(BPF_RET | BPF_K, SECCOMP_RET_ERRNO | ENOSYS),
        BPF_STMT(BPF_RET | BPF_K, SECCOMP_RET_ALLOW),
    };
    const sock_fprog program{4, code};
    return ::prctl(PR_SET_NO_NEW_PRIVS, 1, 0, 0, 0) == 0 &&
           ::prctl(PR_SET_SECCOMP, SECCOMP_MODE_FILTER, &program) == 0;
}

class EndOfAProbe : public ToolsTest {
  protected:
    Verdict verdictOn(const std::wstring& component, std::chrono::milliseconds time) {
        ProbeOptions options;
        options.timeLimit = time;
        return probeLibrary(add(component), options).verdict.verdict;
    }
};

TEST_F(EndOfAProbe, IsFoundWhereTheSystemDoesNotReportIt) {
    using namespace std::chrono_literals;
    bool refused = false;
    // A thread for the test, because the refusal lasts as long as its thread.
    std::thread([&] {
        refused = refuse(SYS_pidfd_open) && ::syscall(SYS_pidfd_open, ::getpid(), 0) < 0;
        if (!refused)
            return;
        EXPECT_EQ(verdictOn(L"goodWithKit", 60s), Verdict::works);
        EXPECT_EQ(verdictOn(L"crashesInEntryPoint", 60s), Verdict::crashed);
        EXPECT_EQ(verdictOn(L"exits", 60s), Verdict::exited);
        EXPECT_EQ(verdictOn(L"loopsForever", 1s), Verdict::timedOut);
    }).join();
    if (!refused)
        GTEST_SKIP() << "this process may not filter system calls";
    EXPECT_FALSE(hasChildProcess());
}

} // namespace
