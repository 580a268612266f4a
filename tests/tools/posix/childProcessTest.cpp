// SPDX-License-Identifier: BSL-1.0
/// Tests how child processes end, what they read, and what keeps them from starting.
#include "components/componentTools/platform/system.h"
#include "tests/support/temporaryDirectory.h"
#include "tests/support/testSystem.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <limits>
#include <stdexcept>
#include <string>
#include <sys/resource.h>

using namespace Mz::Tools;
using namespace Mz::Test;
using namespace std::chrono_literals;

namespace {

using End = System::ChildResult::End;

System::ChildLimits limits() {
    return {60s,
            std::numeric_limits<std::uint64_t>::max(),
            0,
            std::numeric_limits<std::size_t>::max(),
            {}};
}

System::ChildResult runShell(const std::string& script, const System::ChildLimits& allowed,
                             const System::ChildSupply& supply = {}) {
    return System::runChild("/bin/sh", {"-c", script}, allowed, supply);
}

TEST(ChildProcess, EndsByASignalThatIsNamed) {
    const std::pair<const char*, const wchar_t*> signals[] = {
        {"SEGV", L"access to memory that is not there (SIGSEGV)"},
        {"BUS", L"access to memory that has no content (SIGBUS)"},
        {"ILL", L"an instruction that does not exist (SIGILL)"},
        {"FPE", L"an arithmetic fault (SIGFPE)"},
        {"ABRT", L"abort (SIGABRT)"},
        {"TRAP", L"a breakpoint (SIGTRAP)"},
        {"KILL", L"killed from outside (SIGKILL)"},
        {"TERM", L"signal 15"}};
    for (const auto& [name, detail] : signals) {
        const System::ChildResult result =
            runShell(std::string("ulimit -c 0; kill -") + name + " $$", limits());
        EXPECT_EQ(result.end, End::crashed) << name;
        EXPECT_EQ(result.detail, detail) << name;
    }
}

TEST(ChildProcess, GetsMoreInputThanThePipeHolds) {
    std::string input(5'000'000, 'x');
    const System::ChildResult result =
        runShell("sleep 0.05; head -c 5000000 | wc -c", limits(), {&input, nullptr});
    EXPECT_EQ(result.end, End::exited);
    EXPECT_THAT(result.output, testing::HasSubstr("5000000"));
    EXPECT_TRUE(input.empty());
}

TEST(ChildProcess, MayCloseItsInput) {
    std::string input(5'000'000, 'x');
    const System::ChildResult result =
        runShell("exec <&-; sleep 0.05; exit 7", limits(), {&input, nullptr});
    EXPECT_EQ(result.end, End::exited);
    EXPECT_EQ(result.status, 7);
    EXPECT_TRUE(input.empty()) << "it would be tried again for ever";
}

TEST(ChildProcess, IsNotStartedWithoutItsPipes) {
    const TemporaryDirectory folder;
    const System::InheritableFile file(folder.write("file", "content"));
    const std::size_t open = openHandles();
    rlimit before{};
    ASSERT_EQ(::getrlimit(RLIMIT_NOFILE, &before), 0);
    int failures = 0;
    System::ChildResult result;
    for (rlim_t count = 3; count < 100; ++count) {
        std::string input = "input";
        const rlimit few{count, before.rlim_max};
        ::setrlimit(RLIMIT_NOFILE, &few);
        result = runShell("head -c 5; cat <&3", limits(), {&input, &file});
        ::setrlimit(RLIMIT_NOFILE, &before);
        if (result.end != End::notStarted)
            break;
        EXPECT_NE(result.detail, L"") << count;
        EXPECT_EQ(result.output, "") << count;
        ++failures;
    }
    EXPECT_EQ(result.output, "inputcontent");
    EXPECT_GE(failures, 5); // Of the pipe, of the socket, and of the three copies.
    EXPECT_EQ(openHandles(), open);
    EXPECT_FALSE(hasChildProcess());
}

TEST(ChildProcess, IsKilledWhenACallbackThrows) {
    System::ChildLimits allowed = limits();
    allowed.received = [](std::string&) { throw std::runtime_error("enough"); };
    EXPECT_THROW(runShell("echo text; exec sleep 60", allowed), std::runtime_error);
    EXPECT_FALSE(hasChildProcess());
}

} // namespace
