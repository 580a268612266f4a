// SPDX-License-Identifier: BSL-1.0
// Tests the conversion between wide text and UTF-8, and the replacement of invalid input.
#include "components/componentManager/utf8.h"

#include <gtest/gtest.h>

#include <initializer_list>
#include <string>

using namespace Mz;

namespace {

TEST(Utf8, ConvertsBothWays) {
    const std::string bytes = "a\xC3\xA9\xE2\x82\xAC\xF0\x9F\x98\x80";
    EXPECT_EQ(toUtf8(L"a\u00E9\u20AC\U0001F600"), bytes);
    EXPECT_EQ(fromUtf8(bytes), L"a\u00E9\u20AC\U0001F600");
    EXPECT_EQ(toUtf8(std::wstring(1, L'\0')), std::string(1, '\0'));
}

// On Linux, too, where one character is enough: text from elsewhere may contain pairs.
TEST(Utf8, JoinsPairsOfSurrogates) {
    const auto text = [](std::initializer_list<unsigned int> units) {
        std::wstring result;
        for (const unsigned int unit : units)
            result += static_cast<wchar_t>(unit);
        return toUtf8(result);
    };
    EXPECT_EQ(text({'a', 0xD83D, 0xDE00, 'b'}), "a\xF0\x9F\x98\x80"
                                                "b");
    EXPECT_EQ(text({0xD800, 0xDC00}), "\xF0\x90\x80\x80") << "the first";
    EXPECT_EQ(text({0xDBFF, 0xDFFF}), "\xF4\x8F\xBF\xBF") << "the last";
    EXPECT_EQ(text({0xD83D, 'b'}), "\xEF\xBF\xBD"
                                   "b")
        << "a first half alone";
    EXPECT_EQ(text({0xDE00, 0xD83D}), "\xEF\xBF\xBD\xEF\xBF\xBD") << "in the wrong order";
    EXPECT_EQ(text({0xD83D, 0xD83D, 0xDE00}), "\xEF\xBF\xBD\xF0\x9F\x98\x80");
    EXPECT_EQ(text({0xD83D, 0xE000}), "\xEF\xBF\xBD\xEE\x80\x80") << "no second half";
}

TEST(Utf8, EndsAtTheLastCharacter) {
    EXPECT_EQ(fromUtf8("\xF4\x8F\xBF\xBF"), L"\U0010FFFF");
    EXPECT_EQ(fromUtf8("\xF4\x90\x80\x80"), L"\uFFFD\uFFFD\uFFFD\uFFFD") << "beyond it";
    EXPECT_EQ(fromUtf8("\xED\x9F\xBF\xEE\x80\x80"), L"\uD7FF\uE000") << "around the surrogates";
    EXPECT_EQ(fromUtf8("\xED\xA0\x80"), L"\uFFFD\uFFFD\uFFFD") << "the first half of a pair";
    EXPECT_EQ(fromUtf8("\xED\xBF\xBF"), L"\uFFFD\uFFFD\uFFFD") << "the last second half";
}

TEST(Utf8, ReplacesWhatIsNoCharacter) {
    EXPECT_EQ(toUtf8(std::wstring(1, static_cast<wchar_t>(0xD800))), "\xEF\xBF\xBD");
    EXPECT_EQ(fromUtf8("a\xFFz\xC3"), L"a\uFFFDz\uFFFD");
    EXPECT_EQ(fromUtf8("\xE2\x82"), L"\uFFFD\uFFFD");
}

} // namespace
