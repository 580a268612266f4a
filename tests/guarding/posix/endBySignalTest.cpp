// SPDX-License-Identifier: BSL-1.0
/// Tests how the end of a process by a signal is told.
#include "components/componentTools/platform/system.h"

#include <gtest/gtest.h>

#include <chrono>
#include <cstdint>
#include <string>

using namespace Mz::Tools;

namespace {

/// Returns what is told of a process that sends itself this signal.
std::wstring toldOf(const std::string& signal) {
    const System::ChildLimits limits{
        std::chrono::seconds(60), std::uint64_t{1} << 30, 0, std::size_t{1} << 20, {}};
    const System::ChildResult child =
        System::runChild("/bin/sh", {"-c", "kill -" + signal + " $$"}, limits);
    EXPECT_EQ(child.end, System::ChildResult::End::crashed) << signal;
    return child.detail;
}

TEST(EndBySignal, NamesTheFaultOrTheNumber) {
    EXPECT_EQ(toldOf("SEGV"), L"access to memory that is not there (SIGSEGV)");
    EXPECT_EQ(toldOf("BUS"), L"access to memory that has no content (SIGBUS)");
    EXPECT_EQ(toldOf("ILL"), L"an instruction that does not exist (SIGILL)");
    EXPECT_EQ(toldOf("FPE"), L"an arithmetic fault (SIGFPE)");
    EXPECT_EQ(toldOf("TRAP"), L"a breakpoint (SIGTRAP)");
    EXPECT_EQ(toldOf("ABRT"), L"abort (SIGABRT)");
    EXPECT_EQ(toldOf("USR1"), L"signal 10");
}

} // namespace
