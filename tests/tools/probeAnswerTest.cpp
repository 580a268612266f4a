// SPDX-License-Identifier: BSL-1.0
// Tests the messages from the probing child process: valid, cut off and damaged.
#include "components/componentTools/probing/probeAnswer.h"
#include "components/componentTools/probing/frames.h"

#include <gtest/gtest.h>

using namespace Mz::Tools;

namespace {

Description sample() {
    Description description{L"label \u4E2D", L"", 3, {}};
    description.builders.push_back(
        {{1, 2, 3, 4}, L"name", L"\u00E4", std::wstring(2, L'\0'), 5, true});
    return description;
}

TEST(ProbeAnswer, ComesThroughWhole) {
    const ProbeAnswer answer =
        decodeAnswer(encodeStage(Stage::entryPoint) + encodeDescription(sample()));
    EXPECT_EQ(answer.stage, Stage::entryPoint);
    EXPECT_TRUE(answer.anything);
    EXPECT_FALSE(answer.garbled);
    EXPECT_FALSE(answer.fault);
    ASSERT_TRUE(answer.description);
    EXPECT_EQ(answer.description->label, L"label \u4E2D");
    EXPECT_EQ(answer.description->announced, 3u);
    ASSERT_EQ(answer.description->builders.size(), 1u);
    EXPECT_EQ(answer.description->builders[0].text, std::wstring(2, L'\0'));
    EXPECT_TRUE(answer.description->builders[0].flag);
}

TEST(ProbeAnswer, CarriesAFault) {
    const ProbeAnswer answer = decodeAnswer(encodeFault(Verdict::threw, L"a", L"b"));
    EXPECT_EQ(answer.fault, (Finding{Verdict::threw, L"a", L"b"}));
}

TEST(ProbeAnswer, CutOffAnywhereHoldsNoDescriptionAndIsNotGarbled) {
    const std::string stage = encodeStage(Stage::loading);
    const std::string all = stage + encodeDescription(sample());
    for (std::size_t size = 0; size < all.size(); ++size) {
        const ProbeAnswer answer = decodeAnswer(std::string_view(all).substr(0, size));
        ASSERT_FALSE(answer.description) << size;
        ASSERT_FALSE(answer.garbled) << size;
        ASSERT_EQ(answer.cutOff, size != 0 && size != stage.size()) << size;
        ASSERT_EQ(answer.anything, size >= stage.size()) << size;
    }
}

TEST(ProbeAnswer, WithAnyByteChangedIsGarbledOrNotThere) {
    const std::string all = encodeDescription(sample());
    for (std::size_t place = 0; place < all.size(); ++place)
        for (int bit = 0; bit < 8; ++bit) {
            std::string changed = all;
            changed[place] = static_cast<char>(changed[place] ^ 1 << bit);
            const ProbeAnswer answer = decodeAnswer(changed);
            ASSERT_FALSE(answer.description) << place;
        }
}

TEST(ProbeAnswer, WithSomethingBetweenIsGarbled) {
    EXPECT_TRUE(decodeAnswer("hello").garbled);
    EXPECT_TRUE(decodeAnswer(encodeStage(Stage::loading) + "x").garbled);
    EXPECT_FALSE(decodeAnswer("").garbled);
}

TEST(ProbeAnswer, WithWhatNoProbeSendsIsGarbled) {
    // Numbers that are the same in either order of bytes: more characters than follow, the first of
    // which is none.
    const std::string count(4, '\x01'), character(4, '\xFF');
    constexpr unsigned char stage = 0, fault = 1, unknown = 3;
    for (const std::string& invalid :
         {frameOf(fault, count + character), frameOf(fault, count), frameOf(stage, "\x05"),
          frameOf(stage, std::string("\0\0", 2)), frameOf(stage, ""), frameOf(unknown, "")}) {
        const ProbeAnswer answer = decodeAnswer(invalid + encodeFault(Verdict::threw, L"", L""));
        EXPECT_TRUE(answer.garbled);
        EXPECT_FALSE(answer.anything || answer.fault);
    }
}

} // namespace
