// SPDX-License-Identifier: BSL-1.0
/// Tests the child process that loads a library: its limits, its end, and its answer.
#include "tests/tools/toolsFixture.h"

#include <new>

using namespace Mz;
using namespace Mz::Tools;
using namespace Mz::Test;
using ::testing::HasSubstr;

namespace {

class Probe : public ToolsTest {};

TEST_F(Probe, LeavesNoProcessWhenTheCallersQuestionThrows) {
    const auto hangs = add(L"loopsForever");
    ASSERT_FALSE(hasChildProcess());
    ProbeOptions options = patient();
    int asked = 0;
    bool isSeen = false;
    options.interrupted = [&]() -> bool {
        isSeen = isSeen || hasChildProcess();
        if (++asked < 3)
            return false;
        throw std::bad_alloc();
    };
    EXPECT_THROW(probeLibrary(hangs, options), std::bad_alloc);
    EXPECT_EQ(asked, 3);
    EXPECT_TRUE(isSeen);
    EXPECT_FALSE(hasChildProcess());
}

TEST_F(Probe, LeavesNoProcessWhenTheUserInterruptsIt) {
    ProbeOptions options = patient();
    options.interrupted = [] { return true; };
    EXPECT_EQ(probeLibrary(add(L"loopsForever"), options).verdict.verdict, Verdict::interrupted);
    EXPECT_FALSE(hasChildProcess());
}

TEST_F(Probe, LoadsALibraryThatWorksOnce) {
    const std::filesystem::path loads = folder.path() / "loads";
    setEnvironment("MZ_TEST_LOADS", loads.string());
    const ProbeResult result = probeLibrary(add(L"marksItsLoads"), patient());
    setEnvironment("MZ_TEST_LOADS", "");
    ASSERT_EQ(result.builders.size(), 1u);
    EXPECT_EQ(result.builders[0].name, L"marked");
    EXPECT_EQ(contentOf(loads), "x");
}

TEST_F(Probe, CountsMemoryThatIsUsedAndNoAddresses) {
    ProbeOptions options = patient();
    options.memoryLimit = std::uint64_t{300} << 20;
    EXPECT_EQ(probeLibrary(add(L"reservesAddresses"), options).verdict,
              (Finding{Verdict::works, L"1", {}}));
    EXPECT_EQ(probeLibrary(add(L"reservesMemory"), options).verdict,
              (Finding{Verdict::works, L"1", {}}));
}

TEST_F(Probe, CountsMemoryThatProcessesShare) {
    ProbeOptions options = patient();
    options.memoryLimit = std::uint64_t{300} << 20;
    EXPECT_EQ(probeLibrary(add(L"eatsSharedMemory"), options).verdict,
              (Finding{Verdict::outOfMemory, L"enumerateBuilders", L"300"}));
}

TEST_F(Probe, NamesTheLimitAndTheOptionThatRaisesIt) {
    const Finding memory{Verdict::outOfMemory, L"its entry point", L"300"};
    EXPECT_EQ(sentenceOf(memory), L"it uses more memory in its entry point than the 300 MiB "
                                  L"allowed; --memory-limit allows more");
    EXPECT_THAT(cureOf(memory), HasSubstr(L"ProbeOptions::memoryLimit"));
    const Finding time{Verdict::timedOut, L"its entry point", L"10"};
    EXPECT_EQ(sentenceOf(time), L"it did not come to an end in its entry point within 10 seconds; "
                                L"--time-limit allows more");
    EXPECT_THAT(cureOf(time), HasSubstr(L"ProbeOptions::timeLimit"));
    EXPECT_THAT(sentenceOf({Verdict::timedOut, L"its entry point", L"1"}),
                HasSubstr(L"within 1 second; "));
    EXPECT_THAT(sentenceOf({Verdict::timedOut, L"its entry point", L"0.1"}),
                HasSubstr(L"within 0.1 seconds; "));
    EXPECT_EQ(sentenceOf({Verdict::miscounted, L"1", L"2"}),
              L"it announces 1 builder and enumerates 2");
    EXPECT_EQ(sentenceOf({Verdict::miscounted, L"2", L"1"}),
              L"it announces 2 builders and enumerates 1");
}

TEST_F(Probe, TellsALibraryThatClosesWhatItDidNotOpenFromOneThatExits) {
    EXPECT_EQ(probeLibrary(add(L"closesPipes"), patient()).verdict,
              (Finding{Verdict::answerLost, L"enumerateBuilders", {}}));
    EXPECT_EQ(probeLibrary(add(L"exits"), patient()).verdict,
              (Finding{Verdict::exited, L"enumerateBuilders", L"0"}));
}

TEST_F(Probe, TellsALibraryThatWritesIntoItsAnswerFromOneThatExits) {
    EXPECT_EQ(probeLibrary(add(L"writesToPipes"), patient()).verdict,
              (Finding{Verdict::garbled, L"its last message is not whole", {}}));
}

TEST_F(Probe, TellsAnAnswerThatIsTooLongFromTooMuchMemory) {
    const Finding finding = probeLibrary(add(L"writesForever"), patient()).verdict;
    EXPECT_EQ(finding, (Finding{Verdict::answerTooLong, L"64", {}}));
    EXPECT_THAT(sentenceOf(finding), HasSubstr(L"64 MiB"));
}

} // namespace
