/// The process in which a library is tried: how it ends, and what is taken for its answer.
#include "tests/tools/toolsFixture.h"

#include <new>

using namespace Mz;
using namespace Mz::Tools;
using namespace Mz::Test;

namespace {

class Probe : public ToolsTest {};

TEST_F(Probe, LeavesNoProcessWhenTheCallersQuestionThrows) {
    const auto hangs = add(L"loopsForever");
    ASSERT_FALSE(hasChildProcess());
    ProbeOptions options = patient();
    int asked = 0;
    options.interrupted = [&asked]() -> bool {
        if (++asked < 3)
            return false;
        throw std::bad_alloc();
    };
    EXPECT_THROW(probeLibrary(hangs, options), std::bad_alloc);
    EXPECT_EQ(asked, 3);
    EXPECT_FALSE(hasChildProcess());
}

TEST_F(Probe, LeavesNoProcessWhenTheUserInterruptsIt) {
    ProbeOptions options = patient();
    options.interrupted = [] { return true; };
    EXPECT_EQ(probeLibrary(add(L"loopsForever"), options).verdict.verdict, Verdict::interrupted);
    EXPECT_FALSE(hasChildProcess());
}

} // namespace
