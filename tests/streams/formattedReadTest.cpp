// SPDX-License-Identifier: BSL-1.0
// Tests the conversions of formattedRead: the value, the width of the store, and the unread input.
#include "tests/streams/support.h"

#include <gtest/gtest.h>

#include <cmath>
#include <cstdlib>
#include <cstring>
#include <limits>

namespace {

using namespace Mz::Test;
using Mz::int64;
using Mz::QrTextStream;

/// A target between guard bytes, which show a store of the wrong width.
template <class T, std::size_t Count = 1>
class Guarded {
  public:
    Guarded() { std::memset(bytes, 0xA5, sizeof bytes); }
    operator T*() { return reinterpret_cast<T*>(bytes + margin); }
    T get(std::size_t index = 0) const {
        T value;
        std::memcpy(&value, bytes + margin + index * sizeof(T), sizeof(T));
        return value;
    }
    /// Returns whether all bytes after the first `stored` values are unchanged.
    bool intact(std::size_t stored = Count) const {
        for (std::size_t index = 0; index < sizeof bytes; ++index)
            if ((index < margin || index >= margin + stored * sizeof(T)) && bytes[index] != 0xA5)
                return false;
        return true;
    }

  private:
    static constexpr std::size_t margin = 16;
    alignas(16) unsigned char bytes[2 * margin + Count * sizeof(T)];
};

struct Scan {
    template <class... Targets>
    Scan(std::string_view input, const wchar_t* format, Targets... targets) {
        Reading<QrTextStream> in(input);
        assigned = in.stream.formattedRead(format, targets...);
        rest = in.rest();
    }
    int assigned;
    std::string rest;
};

/// Reads a value of type `T`. Expects the stored value and the unread rest.
template <class T>
void expect(std::string_view input, const wchar_t* format, T value, std::string_view rest = "") {
    SCOPED_TRACE(std::string(input));
    Guarded<T> target;
    const Scan scan(input, format, static_cast<T*>(target));
    EXPECT_EQ(scan.assigned, 1);
    EXPECT_EQ(target.get(), value);
    EXPECT_TRUE(target.intact());
    EXPECT_EQ(scan.rest, rest);
}

/// Expects that nothing is stored, and the unread rest.
void expectNone(std::string_view input, const wchar_t* format, std::string_view rest) {
    SCOPED_TRACE(std::string(input));
    Guarded<int64, 8> target;
    const Scan scan(input, format, static_cast<int64*>(target));
    EXPECT_EQ(scan.assigned, 0);
    EXPECT_TRUE(target.intact(0));
    EXPECT_EQ(scan.rest, rest);
}

TEST(FormattedRead, StopsBehindTheNumber) {
    expect("  -42x", L"%d", -42, "x");
    expect("12345", L"%3d", 123, "45");
    expect("-12345", L"%3d", -12, "345");
    expect("+7", L"%d", 7);
    expect("\t\n\v\f\r 7 8", L"%d", 7, " 8");
    expectNone("", L"%d", "");
    expectNone("  ", L"%d", "");
    expectNone("x", L"%d", "x");
    expectNone("  x", L"%d", "x");
    expectNone("-x", L"%d", "x");
    expectNone("-", L"%d", "");
    expectNone("--1", L"%d", "-1");
    expectNone("-5", L"%1d", "5");
}

TEST(FormattedRead, KnowsTheBasesOfNumbers) {
    expect("0x1F", L"%i", 31);
    expect("017", L"%i", 15);
    expect("19", L"%i", 19);
    expect("0", L"%i", 0);
    expect("08", L"%i", 0, "8");
    expect("-0X1f", L"%i", -31);
    expect("1779", L"%o", 0177, "9");
    expect("18", L"%o", 1, "8");
    expect("0x1F", L"%x", 31);
    expect("0XfFg", L"%x", 255, "g");
    expect("fF", L"%x", 255);
    expect("-10", L"%x", -16);
    expect("0", L"%x", 0);
    expect("0 ", L"%x", 0, " ");
    expect("1F", L"%p", 31);
    // These conversions have no prefix: the number is the zero.
    expect("0x1F", L"%p", 0, "x1F");
    expect("0x1F", L"%d", 0, "x1F");
    expectNone("8", L"%o", "8");
    expectNone("g", L"%x", "g");
    expectNone("0xg", L"%x", "g");
    expectNone("0x", L"%i", "");
    // The width ends after the zero or after the prefix.
    expect("0x1F", L"%1x", 0, "x1F");
    expect("0x1F", L"%3x", 1, "F");
    expect("-0x1F", L"%4x", -1, "F");
    expectNone("0x1F", L"%2x", "1F");
}

TEST(FormattedRead, TakesConversionsInEitherCase) {
    expect("-5", L"%D", -5);
    expect("5", L"%U", 5);
    expect("17", L"%O", 15);
    expect("1f", L"%X", 31);
    expect("1f", L"%P", 31);
    expect("0x1f", L"%I", 31);
    expect("1.5", L"%E", 1.5F);
    expect("1.5", L"%G", 1.5F);
    expect("1.5", L"%lE", 1.5);
}

TEST(FormattedRead, StoresTheWidthThatTheModifierNames) {
    expect<short>("-2", L"%hd", -2);
    expect<unsigned short>("65535", L"%hu", 65535);
    expect<short>("10", L"%ho", 8);
    expect<short>("10", L"%hx", 16);
    expect<short>("10", L"%hi", 10);
    expect<int>("-2", L"%d", -2);
    expect<unsigned int>("4294967295", L"%u", 0xFFFFFFFFU);
    expect<unsigned int>("-1", L"%u", 0xFFFFFFFFU);
    expect<long>("-2", L"%ld", -2);
    expect<long>("-2", L"%Ld", -2);
    expect<long>("-2", L"%li", -2);
    expect<unsigned long>("4294967295", L"%lu", 0xFFFFFFFFUL);
    expect<unsigned long>("ffffffff", L"%lx", 0xFFFFFFFFUL);
    expect<int64>("-9223372036854775808", L"%I64d", std::numeric_limits<int64>::min());
    expect<unsigned long long>("18446744073709551615", L"%I64u", ~0ULL);
    expect<unsigned long long>("ffffffffffffffff", L"%I64x", ~0ULL);
    expect<int64>("0x7fffffffffffffff", L"%I64i", std::numeric_limits<int64>::max());
}

TEST(FormattedRead, ALongHasTheSignOfItsConversion) {
    expect<long>("-2", L"%lD", -2);
    expect<long>("4294967294", L"%lD", -2);
    expect<long>("0xFFFFFFFE", L"%lI", -2);
    expect<long>("0xFFFFFFFE", L"%li", -2);
    expect<unsigned long>("-1", L"%lu", 0xFFFFFFFFUL);
    expect<unsigned long>("-1", L"%9lu", 0xFFFFFFFFUL);
    expect<unsigned long>("-1", L"%lU", 0xFFFFFFFFUL);
    expect<unsigned long>("-1", L"%lx", 0xFFFFFFFFUL);
    expect<unsigned long>("37777777777", L"%lo", 0xFFFFFFFFUL);
}

TEST(FormattedRead, TheCharactersBesideTheDigitsAreNone) {
    for (const char* text : {"/", ":", "@", "G", "`", "g"}) {
        expectNone(text, L"%x", text);
        expect(std::string("A") + text, L"%x", 10, text);
        expect(std::string("7") + text, L"%3d", 7, text);
        expect(std::string("7") + text, L"%d", 7, text);
        expect(std::string("7") + text, L"%lg", 7.0, text);
    }
    expect("09afAF", L"%x", 0x09AFAF);
    expectNone("\x08"
               "1",
               L"%d",
               "\x08"
               "1");
    expectNone("\x0E"
               "1",
               L"%d",
               "\x0E"
               "1");
}

TEST(FormattedRead, AWidthOfZeroIsNone) {
    expect("12", L"%0d", 12);
    expect("1.25", L"%0lg", 1.25);
    expect(" a", L"%0c", L' ', "a");
}

TEST(FormattedRead, NumbersAreTakenModuloTheirWidth) {
    expect<int>("4294967297", L"%d", 1);
    expect<int>("2147483648", L"%d", std::numeric_limits<int>::min());
    expect<short>("65537", L"%hd", 1);
    expect<short>("-65537", L"%hd", -1);
    expect<int64>("18446744073709551617", L"%I64d", 1);
    expect<int64>("9223372036854775808", L"%I64d", std::numeric_limits<int64>::min());
    expect<int>("18446744073709551617", L"%d", 1);
    // A long takes the low 32 bits of the text, on every platform.
    expect<long>("4294967297", L"%ld", 1);
    expect<long>("2147483648", L"%ld", -2147483647L - 1);
    expect<unsigned long>("8589934593", L"%lu", 1);
    expect<int>("1" + std::string(500, '0'), L"%d", 0);
}

TEST(FormattedRead, ReadsRealNumbers) {
    expect("1.5e3", L"%lg", 1500.0);
    expect("1.5E+3x", L"%lf", 1500.0, "x");
    expect("1500e-3", L"%le", 1.5);
    expect(".5", L"%lg", 0.5);
    expect("5.", L"%lg", 5.0);
    expect("-0", L"%lg", -0.0);
    expect("+2.5.5", L"%lg", 2.5, ".5");
    expect("1,5", L"%lg", 1.0, ",5");
    expect("12.75", L"%4lg", 12.7, "5");
    expect("-1.25e10", L"%5lg", -1.25, "e10");
    expect("0.1", L"%g", 0.1F);
    expect("0.1", L"%f", 0.1F);
    expect("0.1", L"%Lg", 0.1);
    expect("1e400", L"%lg", std::numeric_limits<double>::infinity());
    expect("-1e400", L"%lg", -std::numeric_limits<double>::infinity());
    expect("1e39", L"%g", std::numeric_limits<float>::infinity());
    expect("1e-400", L"%lg", 0.0);
    expect("1e99999999999999999999", L"%lg", std::numeric_limits<double>::infinity());
    expect("1e-99999999999999999999", L"%lg", 0.0);
    expect("0e99999999999999999999", L"%lg", 0.0);
    expect("4.9406564584124654e-324", L"%lg", std::numeric_limits<double>::denorm_min());
    expect("2.2250738585072011e-308", L"%lg", 2.2250738585072011e-308);
    expect("1.5", L"%hg", 1.5F);
    // The digits decide together with the exponent.
    const std::string zeros(320, '0');
    expect("1" + zeros, L"%lg", std::numeric_limits<double>::infinity());
    expect("0." + zeros + "0000000001e3", L"%lg", 0.0);
    expect("1" + zeros + "e-700", L"%lg", 0.0);
    expect("1" + zeros + "e100", L"%lg", std::numeric_limits<double>::infinity());
    expect("0." + zeros + "1e700", L"%lg", std::numeric_limits<double>::infinity());
    expect("0." + zeros + "1e-100", L"%lg", 0.0);
    expect("000000." + zeros + "1E+700", L"%lg", std::numeric_limits<double>::infinity());
    expect("1" + zeros + "." + "0000e-330", L"%lg", 1e-10);
    for (const char* none : {"", ".", "e5", "x", "inf", "nan", "-", "+.e1"})
        EXPECT_EQ(Scan(none, L"%lg", std::nullptr_t{}).assigned, 0) << none;
    expectNone(".x", L"%lg", "x");
    expectNone("inf", L"%lg", "inf");
}

TEST(FormattedRead, ANumberOutsideTheRangeIsReadBySingleValuesToo) {
    const auto real = []<class T>(const char* text, T value) {
        Reading<QrTextStream> in(text);
        in.stream >> value;
        EXPECT_EQ(in.rest(), " ") << text;
        return value;
    };
    EXPECT_EQ(real("1e400 ", 0.0F), std::numeric_limits<float>::infinity());
    EXPECT_EQ(real("-1e400 ", 0.0F), -std::numeric_limits<float>::infinity());
    EXPECT_EQ(real("1e39 ", 0.0F), std::numeric_limits<float>::infinity());
    EXPECT_EQ(real("1e-400 ", 1.0F), 0.0F);
    EXPECT_EQ(real("1e400 ", 0.0), std::numeric_limits<double>::infinity());
    EXPECT_EQ(real("-1e-400 ", 1.0), 0.0);
}

TEST(FormattedRead, SingleValuesTakeNegativeNumbersModuloTheirWidth) {
    Reading<QrTextStream> in("-1 -2 -3 -4 ");
    int number = 0;
    unsigned int positive = 0;
    int64 wide = 0;
    unsigned long long positiveWide = 0;
    in.stream >> number >> positive >> wide >> positiveWide;
    EXPECT_EQ(number, -1);
    EXPECT_EQ(positive, 0xFFFFFFFEU);
    EXPECT_EQ(wide, -3);
    EXPECT_EQ(positiveWide, 0xFFFFFFFFFFFFFFFCULL);
}

/// Reads a number as a single value, which takes several digits at a time.
void expectNumber(const std::string& text, unsigned long long number, std::string_view rest) {
    Reading<QrTextStream> in(text);
    unsigned long long value = 0;
    in.stream >> value;
    EXPECT_EQ(value, number) << text;
    EXPECT_EQ(in.rest(), rest) << text;
}

TEST(FormattedRead, SeveralDigitsAtATimeEndAtAnyOtherByte) {
    const std::string digits = "1234567898765432123";
    for (std::size_t length = 1; length < 18; ++length)
        for (int byte = 0; byte < 256; ++byte)
            if (byte < '0' || byte > '9') {
                const std::string rest = static_cast<char>(byte) + std::string("987654321 ");
                expectNumber(digits.substr(0, length) + rest, std::stoull(digits.substr(0, length)),
                             rest);
            }
}

TEST(FormattedRead, NumbersOfManyDigitsAreExactUpToTheirWidth) {
    for (const char* number :
         {"99999999", "100000000", "999999999999999999", "1000000000000000000",
          "9999999999999999999", "10000000000000000000", "18446744073709551615"})
        expectNumber(std::string(number) + " ", std::stoull(number), " ");
    expectNumber("18446744073709551616 ", 0, " ");
    expectNumber("00000000000000000000000007 ", 7, " ");
}

TEST(FormattedRead, RealNumbersOfMoreDigitsThanAnIntegerHoldsAreExact) {
    const std::string digits = "99999999999999999999999999";
    for (std::size_t count = 15; count <= digits.size(); ++count)
        for (std::size_t point = 0; point <= count; ++point) {
            const std::string text =
                digits.substr(0, point) + "." + digits.substr(point, count - point);
            Reading<QrTextStream> in(text + " ");
            double value = 0;
            in.stream >> value;
            EXPECT_EQ(value, std::strtod(text.c_str(), nullptr)) << text;
        }
    for (std::size_t count = 15; count <= digits.size(); ++count) {
        Reading<QrTextStream> in(digits.substr(0, count) + " ");
        double value = 0;
        in.stream >> value;
        EXPECT_EQ(value, std::strtod(digits.substr(0, count).c_str(), nullptr)) << count;
    }
}

TEST(FormattedRead, CharactersBehindASingleConversionMustBeThere) {
    expect<std::int16_t>("7;8", L"%hd;", 7, "8");
    expect<std::uint16_t>("7;8", L"%hu;", 7, "8");
    expect<std::int32_t>("7;8", L"%d;", 7, "8");
    expect<std::uint32_t>("7;8", L"%u;", 7, "8");
    expect<long>("7;8", L"%ld;", 7, "8");
    expect<unsigned long>("7;8", L"%lu;", 7, "8");
    expect<int64>("7;8", L"%I64d;", 7, "8");
    expect<unsigned long long>("7;8", L"%I64u;", 7, "8");
    expect<float>("7.5;8", L"%g;", 7.5f, "8");
    expect<double>("7.5;8", L"%lg;", 7.5, "8");
}

TEST(FormattedRead, ANumberGoesOnWhereThePartThatIsParsedAtOnceEnds) {
    // The number is cut after each of its characters by one of these runs of white space.
    for (std::size_t blanks = 40; blanks <= 70; ++blanks) {
        SCOPED_TRACE(blanks);
        const std::string before(blanks, ' ');
        expect<double>(before + "-12.578e+12 ", L"%lg", -12.578e12, " ");
        expect<float>(before + "-12.578e+12 ", L"%g", -12.578e12f, " ");
        expect<std::int32_t>(before + "-1257812 ", L"%d", -1257812, " ");
    }
}

TEST(FormattedRead, ANumberMayFollowAnyAmountOfWhiteSpace) {
    for (std::size_t blanks = 0; blanks < 80; ++blanks)
        expectNumber(std::string(blanks, ' ') + "1234 5", 1234, " 5");
}

TEST(FormattedRead, ZeroKeepsItsSign) {
    Guarded<double> target;
    EXPECT_EQ(Scan("-0.0e5", L"%lg", static_cast<double*>(target)).assigned, 1);
    EXPECT_TRUE(std::signbit(target.get()));
}

TEST(FormattedRead, AnExponentWithoutDigitsIsTakenAndCountsForNothing) {
    expect("1.5e", L"%lg", 1.5);
    expect("1.5e+", L"%lg", 1.5);
    expect("1.5e-x", L"%lg", 1.5, "x");
    expect("1.5ex", L"%lg", 1.5, "x");
    expect("1.5e3", L"%4lg", 1.5, "3");
    expect("2e", L"%g", 2.0F);
}

TEST(FormattedRead, ARealNumberHasAtMost349Characters) {
    const std::string digits(400, '1');
    Guarded<double> target;
    const Scan scan(digits, L"%lg", static_cast<double*>(target));
    EXPECT_EQ(scan.assigned, 1);
    EXPECT_EQ(scan.rest.size(), 400U - 349U);
    const Scan wide(digits, L"%1000lg", static_cast<double*>(target));
    EXPECT_EQ(wide.rest.size(), 400U - 349U);
    const Scan narrow(digits, L"%348lg", static_cast<double*>(target));
    EXPECT_EQ(narrow.rest.size(), 400U - 348U);
    // The sign counts too.
    EXPECT_EQ(Scan("-" + digits, L"%lg", static_cast<double*>(target)).rest.size(), 400U - 348U);
    expect("0." + std::string(346, '0') + "12", L"%lg", 0.0, "2");
    expect("0." + std::string(343, '0') + "1e344", L"%lg", 1e-310, "4");
    expect(std::string(346, '0') + "7e12", L"%lg", 7e1, "2");
}

TEST(FormattedRead, WhiteSpaceOfTheFormatMatchesAnyRun) {
    Guarded<int> a;
    Guarded<int> b;
    EXPECT_EQ(Scan("7", L"%d %d", static_cast<int*>(a), static_cast<int*>(b)).assigned, 1);
    const Scan scan("1,\t\n 2", L"%d,  \n%d", static_cast<int*>(a), static_cast<int*>(b));
    EXPECT_EQ(scan.assigned, 2);
    EXPECT_EQ(a.get(), 1);
    EXPECT_EQ(b.get(), 2);
    EXPECT_EQ(Scan("  x", L" ").rest, "x");
    EXPECT_EQ(Scan("x", L" ").rest, "x");
    EXPECT_EQ(Scan("x", L"").rest, "x");
}

TEST(FormattedRead, OtherCharactersMustBeThere) {
    Guarded<int> target;
    EXPECT_EQ(Scan("a5", L"a%d", static_cast<int*>(target)).assigned, 1);
    EXPECT_EQ(Scan("b5", L"a%d", static_cast<int*>(target)).rest, "b5");
    EXPECT_EQ(Scan(" a5", L"a%d", static_cast<int*>(target)).rest, " a5");
    EXPECT_EQ(Scan("abX", L"abc").rest, "X");
    EXPECT_EQ(Scan("\xE9z", L"\xE9").rest, "z");
}

TEST(FormattedRead, APercentSignIsMatchedBehindWhiteSpace) {
    Guarded<int> target;
    EXPECT_EQ(Scan("%5", L"%%%d", static_cast<int*>(target)).assigned, 1);
    EXPECT_EQ(Scan("  %5", L"%%%d", static_cast<int*>(target)).assigned, 1);
    EXPECT_EQ(Scan("x", L"%%").rest, "x");
}

TEST(FormattedRead, AStarReadsWithoutAnArgument) {
    Guarded<int> target;
    const Scan scan("1 2", L"%*d%d", static_cast<int*>(target));
    EXPECT_EQ(scan.assigned, 1);
    EXPECT_EQ(target.get(), 2);
    EXPECT_EQ(Scan("ab 1.5 xyz5", L"%*s%*lg%*c%*[xyz]%d", static_cast<int*>(target)).assigned, 1);
    EXPECT_EQ(target.get(), 5);
    EXPECT_EQ(Scan("x", L"%*d").rest, "x");
    EXPECT_EQ(Scan("12", L"%*n%d", static_cast<int*>(target)).assigned, 1);
    EXPECT_EQ(Scan("1 2", L"%*1d%3*d%hd", static_cast<int*>(nullptr)).assigned, 0);
}

template <class Character, std::size_t Length>
void expectText(std::string_view input, const wchar_t* format, const Character (&text)[Length],
                std::string_view rest, std::size_t terminators = 1) {
    SCOPED_TRACE(std::string(input));
    Guarded<Character, 16> target;
    const Scan scan(input, format, static_cast<Character*>(target));
    EXPECT_EQ(scan.assigned, 1);
    for (std::size_t index = 0; index < Length - 1 + terminators; ++index)
        EXPECT_EQ(target.get(index), text[index]) << index;
    EXPECT_TRUE(target.intact(Length - 1 + terminators));
    EXPECT_EQ(scan.rest, rest);
}

TEST(FormattedRead, WordsEndAtWhiteSpace) {
    expectText("ab\tcd", L"%s", L"ab", "\tcd");
    expectText(" \n ab", L"%s", L"ab", "");
    for (const char space : {' ', '\t', '\n', '\v', '\f', '\r'})
        expectText(std::string("ab") + space, L"%s", L"ab", {&space, 1});
    expectText("ab\xA0\x85"
               "c",
               L"%s",
               L"ab\xA0\x85"
               L"c",
               "");
    expectText("abcdef", L"%3s", L"abc", "def");
    expectNone("", L"%s", "");
    expectNone("  \n", L"%s", "");
}

TEST(FormattedRead, TheSizeOfTextFollowsCaseAndModifier) {
    expectText("ab", L"%S", "ab", "");
    expectText("ab", L"%hs", "ab", "");
    expectText("ab", L"%hS", "ab", "");
    expectText("ab", L"%ls", L"ab", "");
    expectText("ab", L"%lS", L"ab", "");
    expectText("ab", L"%ws", L"ab", "");
    expectText("ab", L"%wS", L"ab", "");
    expectText("ab", L"%C", "a", "b", 0);
    expectText("ab", L"%hc", "a", "b", 0);
    expectText("ab", L"%lC", L"a", "b", 0);
    expectText("ab", L"%wc", L"a", "b", 0);
    expectText("ab", L"%h[ab]", "ab", "");
    expectText("ab", L"%l[ab]", L"ab", "");
    expectText("\xE9", L"%S", "\xE9", "");
    expectText("\xE9", L"%s", L"\xE9", "");
}

TEST(FormattedRead, CharactersAreTakenAsTheyStandWithoutATerminator) {
    expectText(" ab", L"%c", L" ", "ab", 0);
    expectText(" \nab", L"%3c", L" \na", "b", 0);
    expectText("abc", L"%3hc", "abc", "", 0);
    expectNone("", L"%c", "");
    expectNone("", L"%3c", "");
}

TEST(FormattedRead, SetsAcceptTheirMembers) {
    expectText("abcd", L"%[a-c]", L"abc", "d");
    expectText("abcd", L"%[c-a]", L"abc", "d");
    expectText("ab]c", L"%[]ab]", L"ab]", "c");
    expectText("cd]e", L"%[^]e]", L"cd", "]e");
    expectText("a-b", L"%[-a]", L"a-", "b");
    expectText("a-b", L"%[a-]", L"a-", "b");
    expectText("-a^", L"%[a^-]", L"-a^", "");
    expectText("b-d", L"%[^-a]", L"b", "-d");
    expectText("a-cd", L"%[a-b-c]", L"a-c", "d");
    expectText("x y", L"%[^y]", L"x ", "y");
    expectText(" a", L"%[ a]", L" a", "");
    expectText("aaaa", L"%2[a]", L"aa", "aa");
    expectText("a%d", L"%[%a]", L"a%", "d");
    expectText("0Az_", L"%[0-9A-Za-z]", L"0Az", "_");
    expectText("\xE9\xFF", L"%[\xE9-\xFF]", L"\xE9\xFF", "");
    expectText("ab]", L"%[a-b]]", L"ab", "");
    expectNone(" a", L"%[a]", " a");
    expectNone("", L"%[^a]", "");
    expectNone("b", L"%[a]", "b");
}

TEST(FormattedRead, AnUnfinishedFormatEndsAtItsTerminator) {
    // A scanner that steps over the terminator would find the conversion after it.
    const wchar_t* const unfinished[] = {L"%\0%d",  L"%w\0%d",  L"%5\0%d", L"%*\0%d", L"%I64\0%d",
                                         L"%l\0%d", L"%hL\0%d", L"%F\0%d", L"%N\0%d"};
    for (const wchar_t* format : unfinished) {
        expectNone(" 12", format, "12");
        expectNone("", format, "");
        expectNone("w", format, "w");
        expectNone("%", format, "%");
    }
    expectText("abc", L"%[ab\0%d", L"ab", "c");
    expectText("abc", L"%[a-\0%d", L"a", "bc");
    expectText("abc", L"%[^\0%d", L"abc", "");
    expectText("]a", L"%[]\0%d", L"]", "a");
    expectNone("abc", L"%[\0%d", "abc");
}

TEST(FormattedRead, AnUnknownConversionIsALiteralBehindWhiteSpace) {
    Guarded<int> target;
    EXPECT_EQ(Scan("  y5", L"%y%d", static_cast<int*>(target)).assigned, 1);
    EXPECT_EQ(Scan("Y5", L"%y%d", static_cast<int*>(target)).rest, "Y5");
    EXPECT_EQ(Scan("k5", L"%l3k%d", static_cast<int*>(target)).assigned, 1);
    // "I" without "64" is the conversion %i, which detects the base.
    expect("0x10", L"%I32", 16, "");
    expect("0x10", L"%I6", 16, "");
}

TEST(FormattedRead, ModifiersStandInAnyOrder) {
    expect<short>("1234", L"%3hd", 123, "4");
    expect<short>("1234", L"%h3d", 123, "4");
    expect<int64>("1234", L"%3I64d", 123, "4");
    expect<int64>("1234", L"%I643d", 123, "4");
    expect<double>("1.23", L"%l3g", 1.2, "3");
    expect<int>("12", L"%Fd", 12);
    expect<int>("12", L"%NFNd", 12);
}

TEST(FormattedRead, TheCountLeavesTheLookAheadOut) {
    Guarded<int> number;
    Guarded<int> count;
    const Scan scan(" 12x", L"%d%n", static_cast<int*>(number), static_cast<int*>(count));
    EXPECT_EQ(scan.assigned, 1);
    EXPECT_EQ(count.get(), 3);
    EXPECT_EQ(scan.rest, "x");
    expectNone("x", L"%d%n", "x");
    EXPECT_EQ(Scan("12 x", L"%d %n", static_cast<int*>(number), static_cast<int*>(count)).rest,
              "x");
    EXPECT_EQ(count.get(), 3);
    EXPECT_EQ(Scan("", L"%n", static_cast<int*>(count)).assigned, 0);
    EXPECT_EQ(count.get(), 0);
    Guarded<short> narrow;
    EXPECT_EQ(Scan("ab", L"ab%hn", static_cast<short*>(narrow)).assigned, 0);
    EXPECT_EQ(narrow.get(), 2);
    EXPECT_TRUE(narrow.intact());
    Guarded<int64> wide;
    EXPECT_EQ(Scan("ab", L"ab%I64n", static_cast<int64*>(wide)).assigned, 0);
    EXPECT_EQ(wide.get(), 2);
    Guarded<long> native;
    EXPECT_EQ(Scan("ab", L"ab%ln", static_cast<long*>(native)).assigned, 0);
    EXPECT_EQ(native.get(), 2);
    EXPECT_TRUE(native.intact());
}

TEST(FormattedRead, ANulEndsTextAndIsLeftUnread) {
    using namespace std::string_literals;
    expectText("ab\0c"s, L"%s", L"ab", "\0c"s);
    expectText("ab\0c"s, L"%[^x]", L"ab", "\0c"s);
    expectText("ab\0c"s, L"%5c", L"ab", "\0c"s, 0);
    expectNone("\0ab"s, L"%s", "\0ab"s);
    expectNone("\0ab"s, L"%c", "\0ab"s);
    expectNone("\0ab"s, L"%[^x]", "\0ab"s);
    expectNone("\0"s, L"%d", "\0"s);
    expectNone("  \0"s, L"%w", "\0"s);
    expect("7\0"s, L"%d", 7, "\0"s);
    EXPECT_EQ(Scan("\0x"s, L" x").rest, "\0x"s);
}

TEST(FormattedRead, WidthsMayBeOfAnySize) {
    expect("12", L"%99999999999999999999d", 12);
    expect("12", L"%0000000000000000000002d", 12);
    expectText("ab", L"%4294967297s", L"ab", "");
    expect("12", L"%2147483648d", 12);
}

} // namespace
