// SPDX-License-Identifier: BSL-1.0
// Tests the conversion between wide text and UTF-8, and the replacement of invalid input.
#include "components/componentManager/utf8.h"

#include <gtest/gtest.h>

#include <initializer_list>
#include <string>
#include <utility>

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

// The first and last character of each length of a sequence, and those around the surrogates.
TEST(Utf8, ConvertsTheCharactersAtEveryEdge) {
    const std::pair<const wchar_t*, const char*> edges[] = {
        {L"\x7F", "\x7F"},
        {L"\x80", "\xC2\x80"},
        {L"\x7FF", "\xDF\xBF"},
        {L"\x800", "\xE0\xA0\x80"},
        {L"\xD7FF", "\xED\x9F\xBF"},
        {L"\xE000", "\xEE\x80\x80"},
        {L"\xFFFD", "\xEF\xBF\xBD"},
        {L"\xFFFF", "\xEF\xBF\xBF"},
        {L"\U00010000", "\xF0\x90\x80\x80"},
        {L"\U0010FFFF", "\xF4\x8F\xBF\xBF"},
    };
    for (const auto& [wide, bytes] : edges) {
        EXPECT_EQ(toUtf8(wide), bytes);
        EXPECT_EQ(fromUtf8(bytes), wide);
        EXPECT_EQ(escapeInvalidUtf8(bytes), bytes);
    }
}

TEST(Utf8, ReplacesEachHalfOfAPairThatIsAlone) {
    for (const unsigned int half : {0xD800U, 0xDBFFU, 0xDC00U, 0xDFFFU}) {
        const auto unit = static_cast<wchar_t>(half);
        EXPECT_EQ(toUtf8(std::wstring(1, unit)), "\xEF\xBF\xBD") << half;
        EXPECT_EQ(toUtf8(L"a" + std::wstring(1, unit) + L"b"), "a\xEF\xBF\xBD"
                                                               "b")
            << half;
    }
    const std::wstring pair{static_cast<wchar_t>(0xD83D), static_cast<wchar_t>(0xDE00)};
    EXPECT_EQ(toUtf8(std::wstring_view(pair).substr(0, 1)), "\xEF\xBF\xBD")
        << "the end of the text";
    const std::wstring highs(2, static_cast<wchar_t>(0xDBFF));
    EXPECT_EQ(toUtf8(highs), "\xEF\xBF\xBD\xEF\xBF\xBD");
}

TEST(Utf8, ReplacesWhatIsBeyondTheLastCharacter) {
    if constexpr (sizeof(wchar_t) > 2) {
        for (const unsigned int code : {0x110000U, 0x7FFFFFFFU, 0x80000000U, 0xFFFFFFFFU})
            EXPECT_EQ(toUtf8(std::wstring(1, static_cast<wchar_t>(code))), "\xEF\xBF\xBD") << code;
    }
}

TEST(Utf8, TakesNoSequenceThatIsLongerThanNecessary) {
    for (const char* bytes : {"\xC0\x80", "\xC1\xBF"})
        EXPECT_EQ(fromUtf8(bytes), L"\uFFFD\uFFFD");
    EXPECT_EQ(fromUtf8("\xE0\x9F\xBF"), L"\uFFFD\uFFFD\uFFFD");
    EXPECT_EQ(fromUtf8("\xF0\x8F\xBF\xBF"), L"\uFFFD\uFFFD\uFFFD\uFFFD");
    for (const char* bytes : {"\xF5\x80\x80\x80", "\xF8\x88\x80\x80", "\xFF\x80\x80\x80"})
        EXPECT_EQ(fromUtf8(bytes), L"\uFFFD\uFFFD\uFFFD\uFFFD");
}

TEST(Utf8, HasNoCharacterThatBeginsWithAByteFromF5) {
    for (int first = 0xF5; first <= 0xFF; ++first)
        for (int second = 0x80; second <= 0xBF; ++second) {
            const std::string bytes{static_cast<char>(first), static_cast<char>(second), '\x80',
                                    '\x80'};
            EXPECT_EQ(fromUtf8(bytes), L"\uFFFD\uFFFD\uFFFD\uFFFD") << first << ' ' << second;
            EXPECT_EQ(escapeInvalidUtf8(bytes).size(), 16u) << first << ' ' << second;
        }
}

TEST(Utf8, SkipsOneByteOfWhatIsNoSequence) {
    EXPECT_EQ(fromUtf8("\x80"
                       "a"),
              L"\uFFFD"
              L"a");
    EXPECT_EQ(fromUtf8("\xBF"), L"\uFFFD");
    EXPECT_EQ(fromUtf8("\xE2\x82"
                       "a"),
              L"\uFFFD\uFFFD"
              L"a");
    EXPECT_EQ(fromUtf8("\xE2\xC3\xA9"), L"\uFFFD\u00E9") << "the next sequence is not lost";
    EXPECT_EQ(fromUtf8("\xC3\x7F"), L"\uFFFD\x7F");
    EXPECT_EQ(fromUtf8("\xC3\xC0"), L"\uFFFD\uFFFD");
    EXPECT_EQ(fromUtf8("\xF0\x9F\x98"), L"\uFFFD\uFFFD\uFFFD");
}

TEST(Utf8, ShowsEachByteOfWhatIsNoSequence) {
    EXPECT_EQ(escapeInvalidUtf8("a\xC3\xA9\xE2\x82z"), "a\xC3\xA9\\xE2\\x82z");
    EXPECT_EQ(escapeInvalidUtf8("\x80\x9A\xBF\xFF"), "\\x80\\x9A\\xBF\\xFF");
    EXPECT_EQ(escapeInvalidUtf8("\xED\xA0\x80\xEF\xBF\xBD"), "\\xED\\xA0\\x80\xEF\xBF\xBD");
    EXPECT_EQ(escapeInvalidUtf8(""), "");
}

TEST(Utf8, ReplacesWhatIsNoCharacter) {
    EXPECT_EQ(toUtf8(std::wstring(1, static_cast<wchar_t>(0xD800))), "\xEF\xBF\xBD");
    EXPECT_EQ(fromUtf8("a\xFFz\xC3"), L"a\uFFFDz\uFFFD");
    EXPECT_EQ(fromUtf8("\xE2\x82"), L"\uFFFD\uFFFD");
}

} // namespace
