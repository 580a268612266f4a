// SPDX-License-Identifier: BSL-1.0
// Tests the texts of records.
#include "components/componentManager/manager/sharedText.h"
#include "tests/support/failingAllocations.h"

#include <gtest/gtest.h>

#include <string>
#include <utility>

using namespace Mz;
using namespace Mz::Test;

namespace {

TEST(SharedText, HasTheCharactersThatItWasGiven) {
    EXPECT_STREQ(SharedText().c_str(), L"");
    EXPECT_STREQ(SharedText(L"").c_str(), L"");
    std::wstring source = L"\u00E9 \u4E2D text";
    SharedText text(source);
    const SharedText assigned = [&] {
        SharedText other;
        other = std::wstring_view(source).substr(4);
        return other;
    }();
    source = L"another one";
    EXPECT_STREQ(text.c_str(), L"\u00E9 \u4E2D text");
    EXPECT_EQ(text.view(), L"\u00E9 \u4E2D text");
    EXPECT_STREQ(assigned.c_str(), L"text");
    text = L"shorter";
    EXPECT_STREQ(text.c_str(), L"shorter");
    text = L"";
    EXPECT_STREQ(text.c_str(), L"");
}

TEST(SharedText, SharesItsCharactersWithItsCopies) {
    SharedText first(L"folder");
    SharedText second = first;
    EXPECT_EQ(second.c_str(), first.c_str());
    const wchar_t* const characters = first.c_str();
    first = L"another";
    EXPECT_STREQ(second.c_str(), L"folder");
    EXPECT_EQ(second.c_str(), characters);
    const SharedText third = std::move(second);
    EXPECT_EQ(third.c_str(), characters);
    first = third;
    first = std::as_const(first);
    EXPECT_EQ(first.c_str(), characters);
}

TEST(SharedText, IsComparedByItsCharacters) {
    const SharedText text(L"name"), same(L"name"), other(L"names"), empty;
    EXPECT_NE(text.c_str(), same.c_str());
    EXPECT_TRUE(text == same);
    EXPECT_FALSE(text == other);
    EXPECT_FALSE(text == empty);
    EXPECT_TRUE(empty == SharedText());
    EXPECT_TRUE(text == std::wstring(L"name"));
    EXPECT_FALSE(text == L"nam");
}

TEST(SharedText, CopiesWithoutAnAllocationAndStaysAsItWasWithoutMemory) {
    SharedText text(L"as it was");
    const FailingAllocations failing(0);
    const SharedText copy = text;
    SharedText empty(L"");
    empty = L"";
    EXPECT_FALSE(failing.failed());
    EXPECT_THROW(text = L"another", std::bad_alloc);
    EXPECT_STREQ(text.c_str(), L"as it was");
    EXPECT_STREQ(copy.c_str(), L"as it was");
}

} // namespace
