// SPDX-License-Identifier: BSL-1.0
// Tests the conversion between wide text and UTF-8, and the replacement of invalid input.
#include "components/componentManager/utf8.h"

#include <gtest/gtest.h>

using namespace Mz;

namespace {

TEST(Utf8, ConvertsBothWays) {
    const std::string bytes = "a\xC3\xA9\xE2\x82\xAC\xF0\x9F\x98\x80";
    EXPECT_EQ(toUtf8(L"a\u00E9\u20AC\U0001F600"), bytes);
    EXPECT_EQ(fromUtf8(bytes), L"a\u00E9\u20AC\U0001F600");
    EXPECT_EQ(toUtf8(std::wstring(1, L'\0')), std::string(1, '\0'));
}

TEST(Utf8, ReplacesWhatIsNoCharacter) {
    EXPECT_EQ(toUtf8(std::wstring(1, static_cast<wchar_t>(0xD800))), "\xEF\xBF\xBD");
    EXPECT_EQ(fromUtf8("a\xFFz\xC3"), L"a\uFFFDz\uFFFD");
    EXPECT_EQ(fromUtf8("\xE2\x82"), L"\uFFFD\uFFFD");
}

} // namespace
