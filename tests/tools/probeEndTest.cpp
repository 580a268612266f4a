// SPDX-License-Identifier: BSL-1.0
// What the end of a probe means, together with what it has reported, and how exceptions are named.
#include "components/componentTools/probing/probeProcess.h"

#include "components/componentManager/exceptions.h"
#include "components/componentTools/probing/exceptionText.h"
#include "components/componentTools/probing/fatalFaults.h"
#include "components/componentTools/probing/frames.h"

#include <gtest/gtest.h>

#include <new>
#include <stdexcept>
#include <string>
#include <unwind.h>

using namespace Mz;
using namespace Mz::Tools;
using namespace std::chrono_literals;

namespace {

using End = System::ChildResult::End;

ProbeOptions options() {
    ProbeOptions wanted;
    wanted.timeLimit = 1500ms;
    wanted.memoryLimit = std::uint64_t{64} << 20;
    return wanted;
}

System::ChildResult endedBy(End end, int status = 0, std::uint64_t memory = 0) {
    System::ChildResult child;
    child.end = end;
    child.status = status;
    child.memory = memory;
    return child;
}

/// The messages of a library that was described up to its builders.
ProbeAnswer answer() {
    ProbeAnswer given;
    given.anything = true;
    given.stage = Stage::enumerating;
    return given;
}

TEST(ProbeEnd, NamesTheTimeLimitInTenthsOfSeconds) {
    ProbeOptions wanted = options();
    EXPECT_EQ(judgeEnd(endedBy(End::timedOut), answer(), wanted),
              (Finding{Verdict::timedOut, L"enumerateBuilders", L"1.5"}));
    wanted.timeLimit = 20s;
    EXPECT_EQ(judgeEnd(endedBy(End::timedOut), answer(), wanted).words, L"20");
    wanted.timeLimit = 50ms;
    EXPECT_EQ(judgeEnd(endedBy(End::timedOut), answer(), wanted).words, L"0");
}

TEST(ProbeEnd, TellsAFullMemoryFromALibraryThatOnlyClaimsIt) {
    ProbeAnswer given = answer();
    given.fault = Finding{Verdict::outOfMemory, {}, {}};
    const std::uint64_t half = options().memoryLimit / 2;
    EXPECT_EQ(judgeEnd(endedBy(End::exited, 0, half), given, options()),
              (Finding{Verdict::outOfMemory, L"enumerateBuilders", L"64"}));
    EXPECT_EQ(judgeEnd(endedBy(End::exited, 0, half - 1), given, options()),
              (Finding{Verdict::threw, L"enumerateBuilders", L"std::bad_alloc"}));
}

TEST(ProbeEnd, WithoutAnyMessageIsNoFaultOfTheLibrary) {
    EXPECT_EQ(judgeEnd(endedBy(End::exited, 127), ProbeAnswer(), options()),
              (Finding{Verdict::probeFailed, L"it ended at once, with status 127", {}}));
    EXPECT_EQ(judgeEnd(endedBy(End::exited, 127), answer(), options()),
              (Finding{Verdict::exited, L"enumerateBuilders", L"127"}));
}

TEST(ProbeEnd, WithAnUnknownStatusIsUnknownUnlessTheReportIsComplete) {
    EXPECT_EQ(judgeEnd(endedBy(End::unknown), answer(), options()).verdict, Verdict::endUnknown);
    ProbeAnswer complete = answer();
    complete.description.emplace();
    EXPECT_EQ(judgeEnd(endedBy(End::unknown), complete, options()).verdict, Verdict::offersNothing);
    complete.description->builders.resize(2);
    EXPECT_EQ(judgeEnd(endedBy(End::unknown), complete, options()),
              (Finding{Verdict::works, L"2", {}}));
}

TEST(ProbeFrames, EndForGoodAtTheFirstFault) {
    const std::string whole = frameOf(1, "payload");
    const std::string mixed = whole + "foreign bytes" + whole;
    FrameReader invalid(mixed);
    EXPECT_TRUE(invalid.next());
    for (int count = 0; count < 2; ++count) {
        EXPECT_FALSE(invalid.next()) << count;
        EXPECT_TRUE(invalid.garbled()) << count;
    }
    FrameReader incomplete(std::string_view(whole).substr(0, whole.size() - 1));
    for (int count = 0; count < 2; ++count) {
        EXPECT_FALSE(incomplete.next()) << count;
        EXPECT_TRUE(incomplete.cutOff()) << count;
    }
}

template <class Throw>
Finding findingOf(Throw raise) {
    try {
        raise();
    } catch (...) {
        return exceptionFinding(Verdict::threw, L"before: ");
    }
    return {};
}

TEST(ExceptionFinding, HasTheReasonOfEachKindOfException) {
    EXPECT_EQ(findingOf([] { throw std::bad_alloc(); }), (Finding{Verdict::outOfMemory, {}, {}}));
    EXPECT_EQ(findingOf([] { throw std::runtime_error("text"); }),
              (Finding{Verdict::threw, {}, L"before: text"}));
    const QrStreamEx::ExReadError failure("source", 7, "it is empty");
    const std::string reason = failure.getReason();
    EXPECT_EQ(
        findingOf([&] { throw failure; }),
        (Finding{Verdict::threw, {}, L"before: " + std::wstring(reason.begin(), reason.end())}));
    EXPECT_EQ(findingOf([] { throw 7; }),
              (Finding{Verdict::threw, {}, L"before: a value of type int"}));
}

TEST(ExceptionFinding, KnowsExceptionsOfOtherLanguages) {
    static _Unwind_Exception foreign{};
    foreign.exception_class = 0x4D5A544553543031; // No runtime has this one.
    int deleted = 0;
    static int* const count = &deleted;
    foreign.exception_cleanup = [](_Unwind_Reason_Code, _Unwind_Exception*) { ++*count; };
    EXPECT_EQ(findingOf([] { _Unwind_RaiseException(&foreign); }),
              (Finding{Verdict::threw, {}, L"before: an exception of another language"}));
    EXPECT_EQ(deleted, 1);
    std::wstring text;
    try {
        _Unwind_RaiseException(&foreign);
        FAIL() << "nothing was thrown";
    } catch (...) {
        text = exceptionText();
    }
    EXPECT_EQ(text, L"an exception of another language");
    EXPECT_EQ(deleted, 2);
}

TEST(ExceptionFinding, TakesAMissingTextForAnEmptyOne) {
    EXPECT_EQ(foreignText(nullptr), L"");
    EXPECT_EQ(foreignText("text"), L"text");
}

} // namespace
