// SPDX-License-Identifier: BSL-1.0
// Tests the conversions of formattedWrite against the expected texts.
#include "tests/streams/support.h"

#include <gmock/gmock.h>

#include <cctype>
#include <cmath>
#include <cstdint>
#include <cstdlib>
#include <limits>

namespace {

using namespace Mz::Test;
using Mz::int64;
using Mz::QrStreamEx;
using Mz::QrTextStream;

template <class... Arguments>
std::string formatted(const wchar_t* format, Arguments... arguments) {
    Writing<QrTextStream> out;
    const int length = out.stream.formattedWrite(format, arguments...);
    const std::string bytes = out.bytes();
    EXPECT_EQ(length, static_cast<int>(bytes.size()));
    return bytes;
}

TEST(FormattedWrite, PutsIntegersInTheirWidthAndPrecision) {
    EXPECT_EQ(formatted(L"%d|%5d|%-5d|%05d|%+d|% d", 42, 42, 42, 42, 42, 42),
              "42|   42|42   |00042|+42| 42");
    EXPECT_EQ(formatted(L"%.5d|%8.5d|%-8.5d|%08.5d", -42, -42, -42, -42),
              "-00042|  -00042|-00042  |  -00042");
    EXPECT_EQ(formatted(L"%.0d|%.0d|%5.0d|%+.0d", 0, 1, 0, 0), "|1|     |+");
    EXPECT_EQ(formatted(L"%x|%X|%#x|%#X|%#x|%o|%#o|%#o", 255, 255, 255, 255, 0, 8, 8, 0),
              "ff|FF|0xff|0XFF|0|10|010|0");
    EXPECT_EQ(formatted(L"%#08x|%-#8xz|%#.4x", 255, 255, 255), "0x0000ff|0xff    z|0x00ff");
    EXPECT_EQ(formatted(L"%*d|%-*d|%*d|%.*d|%.*d", 4, 7, 4, 7, -4, 7, 3, 7, -3, 7),
              "   7|7   |7   |007|7");
    EXPECT_EQ(formatted(L"%+u|% x", 5U, 5U), "5|5");
}

TEST(FormattedWrite, KnowsTheSizesOfIntegers) {
    constexpr int64 smallest = std::numeric_limits<int64>::min();
    EXPECT_EQ(formatted(L"%I64d|%lld|%I64u|%I64x", smallest, smallest, ~0ULL, ~0ULL),
              "-9223372036854775808|-9223372036854775808|18446744073709551615|ffffffffffffffff");
    EXPECT_EQ(formatted(L"%zu|%zx|%jd|%ju|%td|%Iu|%Id|%d", ~std::size_t(0), std::size_t(255),
                        smallest, ~0ULL, std::ptrdiff_t(-1), ~std::size_t(0), std::ptrdiff_t(-2),
                        7),
              "18446744073709551615|ff|-9223372036854775808|18446744073709551615|-1|"
              "18446744073709551615|-2|7");
    EXPECT_EQ(formatted(L"%hd|%hu|%hhd|%hhu", 65537, 65537, 257, -1), "1|1|1|255");
    EXPECT_EQ(formatted(L"%I32d|%I32u", -1, 0xFFFFFFFFU), "-1|4294967295");
    EXPECT_EQ(formatted(L"%ld|%lu|%lx", -2147483647L - 1, 4294967295UL, 255UL),
              "-2147483648|4294967295|ff");
    EXPECT_EQ(formatted(L"%d|%u|%i", std::numeric_limits<int>::min(), 4294967295U, -1),
              "-2147483648|4294967295|-1");
}

TEST(FormattedWrite, TakesTheLowBitsOfAShortSizeInEveryConversion) {
    EXPECT_EQ(
        formatted(L"%hd|%hi|%hu|%ho|%hx|%hX", 0x1ABCD, 0x1ABCD, 0x1ABCD, 0x1ABCD, 0x1ABCD, 0x1ABCD),
        "-21555|-21555|43981|125715|abcd|ABCD");
    EXPECT_EQ(formatted(L"%hhd|%hhi|%hhu|%hho|%hhx|%hhX", 0x1AB, 0x1AB, 0x1AB, 0x1AB, 0x1AB, 0x1AB),
              "-85|-85|171|253|ab|AB");
    EXPECT_EQ(formatted(L"%hd|%hd|%hu|%hu", 32767, 32768, 65535, 65536), "32767|-32768|65535|0");
    EXPECT_EQ(formatted(L"%hhd|%hhd|%hhu|%hhu", 127, 128, 255, 256), "127|-128|255|0");
    EXPECT_EQ(formatted(L"%#hx|%#hho|%05hhd", 0xFFFF1, 0x108, 0x1FF), "0xfff1|010|-0001");
    // The sizes of characters and of real numbers are none of integers.
    EXPECT_EQ(formatted(L"%wd|%Ld|%wu", -1, -2, 3U), "-1|-2|3");
}

TEST(FormattedWrite, CombinesFlags) {
    EXPECT_EQ(formatted(L"%+ d|% +d|% d", 5, 5, -5), "+5|+5|-5");
    EXPECT_EQ(formatted(L"%-05d|%0-5d|%--5d|%-+ #08x|", 42, 42, 42, 255),
              "42   |42   |42   |0xff    |");
    EXPECT_EQ(formatted(L"%+05d|% 05d|%+-5d|", 42, 42, 42), "+0042| 0042|+42  |");
    EXPECT_EQ(formatted(L"%#.3o|%#.1o|%#.0o|%#.0x|%.0u", 8, 8, 0, 0, 0), "010|010|0||");
    EXPECT_EQ(formatted(L"%2d|%3d|%4d", 123, 123, 123), "123|123| 123");
    EXPECT_EQ(formatted(L"%-2d|%-3d|%-4d|", 123, 123, 123), "123|123|123 |");
    EXPECT_EQ(formatted(L"%.2d|%.3d|%.4d", 123, 123, 123), "123|123|0123");
}

TEST(FormattedWrite, PutsRealNumbersAlikeOnEveryPlatform) {
    EXPECT_EQ(formatted(L"%e|%.0e|%#.0e|%E", 1e10, 1e10, 1e10, 1e-5),
              "1.000000e+10|1e+10|1.e+10|1.000000E-05");
    EXPECT_EQ(formatted(L"%g|%g|%G|%.3g|%#g|%#.3g", 1e5, 1e-5, 1e100, 1234.0, 1.0, 1e10),
              "100000|1e-05|1E+100|1.23e+03|1.00000|1.00e+10");
    EXPECT_EQ(formatted(L"%f|%.0f|%#.0f|%.1f|%.2f", 1.5, 2.5, 2.5, 0.25, 0.125),
              "1.500000|2|2.|0.2|0.12");
    EXPECT_EQ(formatted(L"%8.3f|%-8.3f|%08.3f|%+.1f|% .1f|%+08.2f", -1.5, 1.5, -1.5, 1.5, 1.5, 1.5),
              "  -1.500|1.500   |-001.500|+1.5| 1.5|+0001.50");
    EXPECT_EQ(formatted(L"%.16g|%.9g", 0.1, static_cast<double>(0.1F)), "0.1|0.100000001");
    EXPECT_EQ(formatted(L"%.0g|%g|%g", 0.5, 0.0, -0.0), "0.5|0|-0");
    EXPECT_EQ(formatted(L"%a|%A", 1.0, -0.5), "0x1p+0|-0X1P-1");
    EXPECT_EQ(formatted(L"%.1100f", std::numeric_limits<double>::denorm_min()).size(), 1102U);
    EXPECT_EQ(formatted(L"%f", 1e308).size(), 316U);
}

TEST(FormattedWrite, TakesLongDoublesToo) {
    EXPECT_EQ(formatted(L"%Lf|%.3Le|%Lg|%10.2Lf", 1.5L, 1e10L, 0.1L, -2.25L),
              "1.500000|1.000e+10|0.1|     -2.25");
}

TEST(FormattedWrite, PutsLongDoublesInEveryConversion) {
    EXPECT_EQ(formatted(L"%Lf|%LF|%Le|%LE|%Lg|%LG", 1.5L, -1.5L, 0.15625L, -0.15625L, 1e-5L, 1e20L),
              "1.500000|-1.500000|1.562500e-01|-1.562500E-01|1e-05|1E+20");
    EXPECT_EQ(formatted(L"%#.0Lf|%#.0Le|%#Lg|%#.3Lg|%#.0Lg", 2.0L, 2.0L, 1.0L, 1e10L, 1.0L),
              "2.|2.e+00|1.00000|1.00e+10|1.");
    EXPECT_EQ(
        formatted(L"%#Lg|%#Lg|%#Lg|%#Lg|%#LG", 0.0001L, 0.00001L, 123456.0L, 999999.5L, 1234567.0L),
        "0.000100000|1.00000e-05|123456.|1.00000e+06|1.23457E+06");
    EXPECT_EQ(formatted(L"%+Lf|% Le|%010.2Lf|%-10.2Lf|", 1.5L, 2.5L, -2.25L, 2.25L),
              "+1.500000| 2.500000e+00|-000002.25|2.25      |");
    using Limits = std::numeric_limits<long double>;
    EXPECT_EQ(formatted(L"%Lf|%LE|%Lg|%La|%LA|%05Lg", Limits::infinity(), -Limits::infinity(),
                        Limits::quiet_NaN(), Limits::infinity(), -Limits::infinity(),
                        Limits::infinity()),
              "inf|-INF|nan|inf|-INF|  inf");
    const auto whole = static_cast<std::size_t>(Limits::max_exponent10) + 1;
    EXPECT_EQ(formatted(L"%.0Lf", Limits::max()).size(), whole);
    EXPECT_EQ(formatted(L"%.3Lf", -Limits::max()).size(), whole + 5);
}

TEST(FormattedWrite, PutsLongDoublesInHexadecimalExactly) {
    for (const long double value : {1.0L, -0.75L, 0.1L, 1e100L, 0.0L}) {
        const std::string lower = formatted(L"%La", value);
        std::string upper = lower;
        for (char& c : upper)
            c = static_cast<char>(std::toupper(c));
        EXPECT_EQ(formatted(L"%LA", value), upper);
        EXPECT_EQ(lower.find("0x"), value < 0 ? 1U : 0U) << lower;
        EXPECT_EQ(std::strtold(lower.c_str(), nullptr), value) << lower;
        EXPECT_NE(formatted(L"%#La", value).find('.'), std::string::npos);
        EXPECT_EQ(formatted(L"%.3La", value).find('p') - formatted(L"%.3La", value).find('.'), 4U);
    }
}

// The leading digit of such a number may be an "e", which is also the mark of an exponent.
TEST(FormattedWrite, PutsThePointOfAHexadecimalLongDoubleAfterItsDigit) {
    for (const long double value : {1.0L, 1.25L, 1.5L, 1.75L, 1.875L}) {
        std::string pointed = formatted(L"%.0La", value);
        pointed.insert(pointed.find('p'), 1, '.');
        EXPECT_EQ(formatted(L"%#.0La", value), pointed);
        EXPECT_EQ(formatted(L"%#.0LA", value).find('.'), 3U);
    }
}

TEST(FormattedWrite, PutsTheAlternateFormOfDoubles) {
    EXPECT_EQ(formatted(L"%#.0g|%#.1g|%#.0a|%#.0E", 1.0, 20.0, 1.0, 3.0),
              "1.|2.e+01|0x1.p+0|3.E+00");
    EXPECT_EQ(formatted(L"%#g|%#g|%#g|%#g", 0.0001, 0.00001, 123456.0, 1234567.0),
              "0.000100000|1.00000e-05|123456.|1.23457e+06");
    EXPECT_EQ(formatted(L"%#.3g|%#.3g|%#.3g|%#g", 100.0, 999.0, 1000.0, 0.0),
              "100.|999.|1.00e+03|0.00000");
    EXPECT_EQ(formatted(L"%#.2f|%#.2e|%#G", 1.0, 1.0, 1e-7), "1.00|1.00e+00|1.00000E-07");
}

TEST(FormattedWrite, PutsTheSignAndZerosOfRealNumbersBeforeTheirDigits) {
    EXPECT_EQ(formatted(L"%08a|%+08A|%-8a|", 1.0, 1.0, 1.0), "0x001p+0|+0X01P+0|0x1p+0  |");
    EXPECT_EQ(formatted(L"%+g|% g|%+ g|% +g|%+g", 1.5, 1.5, 1.5, 1.5, -1.5),
              "+1.5| 1.5|+1.5|+1.5|-1.5");
    EXPECT_EQ(formatted(L"%+g|% g|%-6g|%06g", HUGE_VAL, HUGE_VAL, HUGE_VAL, -HUGE_VAL),
              "+inf| inf|inf   |  -inf");
    EXPECT_EQ(formatted(L"%.0f", std::numeric_limits<double>::max()).size(), 309U);
}

TEST(FormattedWrite, SpellsInfinityAndNaN) {
    const double infinity = std::numeric_limits<double>::infinity();
    const double nan = std::numeric_limits<double>::quiet_NaN();
    EXPECT_EQ(formatted(L"%g|%f|%e|%G|%5g|%05g|%+g", infinity, -infinity, infinity, infinity,
                        infinity, infinity, infinity),
              "inf|-inf|inf|INF|  inf|  inf|+inf");
    EXPECT_EQ(formatted(L"%g|%F|%g", nan, nan, -nan), "nan|NAN|-nan");
    EXPECT_EQ(written<QrTextStream>([&](Mz::QrStream& s) { s << infinity << -HUGE_VALF; }),
              "inf -inf");
}

TEST(FormattedWrite, TextIsWideUnlessItIsSaidToBeNarrow) {
    EXPECT_EQ(formatted(L"%s|%ls|%S|%hs|%ws|%lS", L"ab", L"cd", "ef", "gh", L"ij", L"kl"),
              "ab|cd|ef|gh|ij|kl");
    EXPECT_EQ(formatted(L"%c|%lc|%C|%hc", L'a', L'b', 'c', 'd'), "a|b|c|d");
    EXPECT_EQ(formatted(L"%5s|%-5s|%.1s|%5.1s|%.0s", L"ab", L"ab", L"ab", L"ab", L"ab"),
              "   ab|ab   |a|    a|");
    EXPECT_EQ(formatted(L"%hs|%S|%C", "\xE9\xFF", "\x80", '\xE9'), "\xE9\xFF|\x80|\xE9");
    EXPECT_EQ(formatted(L"%s", L"\xE9"), "\xE9");
}

TEST(FormattedWrite, TheSizeOfTextIsTheLastWord) {
    EXPECT_EQ(formatted(L"%hhs|%hhc|%hS|%hC|%hhS", "ab", 'c', "de", 'f', "g"), "ab|c|de|f|g");
    EXPECT_EQ(formatted(L"%wc|%wC|%lC|%wS", L'a', L'b', L'c', L"de"), "a|b|c|de");
    EXPECT_EQ(formatted(L"%I64s|%I64S|%Ls|%zc", L"ab", "cd", L"ef", L'g'), "ab|cd|ef|g");
    // A narrow character is one byte of its argument.
    EXPECT_EQ(formatted(L"%hc|%C|%hhc", 0x141, 0x142, 0x143), "A|B|C");
}

TEST(FormattedWrite, PadsTextToItsWidth) {
    EXPECT_EQ(formatted(L"%05s|%-05s|%03c|%05S", L"ab", L"ab", L'c', "de"),
              "000ab|ab   |00c|000de");
    EXPECT_EQ(formatted(L"%3c|%-3c|%1c|%0c", L'a', L'b', L'c', L'd'), "  a|b  |c|d");
    EXPECT_EQ(formatted(L"%*s|%-*s|%*s|", 4, L"ab", -4, L"cd", -4, L"ef"), "  ab|cd  |ef  |");
}

TEST(FormattedWrite, TakesAPrecisionFromAnArgument) {
    EXPECT_EQ(formatted(L"%.*s|%.*s|%.*s", -1, L"ab", 0, L"ab", 1, L"ab"), "ab||a");
    EXPECT_EQ(formatted(L"%.*f|%.*f|%.*e", -2, 1.5, 0, 2.5, 1, 2.0), "1.500000|2|2.0e+00");
    EXPECT_EQ(formatted(L"%.d|%.s|%.f|%.x", 0, L"ab", 2.5, 0), "||2|");
}

TEST(FormattedWrite, APrecisionOfAnyNumberOfDigitsIsALargeOne) {
    EXPECT_EQ(formatted(L"%.4294967297s|%.99999999999999999999S", L"abc", "def"), "abc|def");
    EXPECT_EQ(formatted(L"%.00000000000000000000002s", L"abc"), "ab");
}

TEST(FormattedWrite, NeverReadsTextBeyondItsPrecision) {
    const wchar_t wide[2] = {L'a', L'b'}; // No terminator.
    const char narrow[2] = {'c', 'd'};
    EXPECT_EQ(formatted(L"%.2s|%.1s|%.2S", static_cast<const wchar_t*>(wide),
                        static_cast<const wchar_t*>(wide), static_cast<const char*>(narrow)),
              "ab|a|cd");
}

TEST(FormattedWrite, ANullTextIsSpeltOut) {
    EXPECT_EQ(formatted(L"%s|%S|%8s", static_cast<const wchar_t*>(nullptr),
                        static_cast<const char*>(nullptr), static_cast<const wchar_t*>(nullptr)),
              "(null)|(null)|  (null)");
    EXPECT_EQ(formatted(L"%.3s|%.0S|%.9hs", static_cast<const wchar_t*>(nullptr),
                        static_cast<const char*>(nullptr), static_cast<const char*>(nullptr)),
              "(nu||(null)");
}

TEST(FormattedWrite, LiteralsAndPercentSigns) {
    EXPECT_EQ(formatted(L""), "");
    EXPECT_EQ(formatted(L"100%% sure\n"), "100% sure\n");
    EXPECT_EQ(formatted(L"%y|%5!"), "%y|%5!");
    EXPECT_EQ(formatted(L"%-+ #08.3I64q|%hhy|%5%"), "%-+ #08.3I64q|%hhy|%");
    EXPECT_EQ(formatted(L"%.*k|%*!", 3, 4), "%.*k|%*!") << "the numbers are taken all the same";
}

TEST(FormattedWrite, TheOutputMayBeOfAnyLength) {
    EXPECT_EQ(formatted(L"%5000d", 7), std::string(4999, ' ') + "7");
    EXPECT_EQ(formatted(L"%.5000d", 7), std::string(4999, '0') + "7");
    EXPECT_EQ(formatted(L"%s", std::wstring(100'000, L'x').c_str()), std::string(100'000, 'x'));
    EXPECT_EQ(formatted(L"%.5000f", 0.5), "0.5" + std::string(4999, '0'));
    EXPECT_EQ(formatted((std::wstring(4096, L'a') + L"%d").c_str(), 1),
              std::string(4096, 'a') + "1");
}

TEST(FormattedWrite, AnUnfinishedDirectiveIsAWriteError) {
    for (const wchar_t* format : {L"%", L"a%", L"%5", L"%.", L"%l", L"%-+ #0", L"%I64"}) {
        Writing<QrTextStream> out;
        try {
            out.stream.formattedWrite(format);
            FAIL();
        } catch (const QrStreamEx::ExWriteError& error) {
            EXPECT_STREQ(error.getReason(), "Error writing stream.");
            EXPECT_EQ(
                std::string(error.getDetailedReason()).find("components/componentManager/stream("),
                0U);
        }
        EXPECT_EQ(out.bytes(), "");
    }
}

TEST(FormattedWrite, ACharacterBeyondTheCLocaleIsAWriteErrorBehindWhatCameBefore) {
    Writing<QrTextStream> out;
    out.stream << 1;
    EXPECT_THROW(out.stream.formattedWrite(L"ab%sc", L"\x20AC"), QrStreamEx::ExWriteError);
    EXPECT_EQ(out.bytes(), "1 ab");
}

TEST(FormattedWrite, CountsWhatItHasFormatted) {
    int count = -1;
    EXPECT_EQ(formatted(L"abc%n%d", &count, 5), "abc5");
    EXPECT_EQ(count, 3);
}

TEST(FormattedWrite, StoresItsCountInTheWidthThatIsSaid) {
    signed char bytes[] = {0x55, -1, 0x55};
    short half[] = {0x5555, -1, 0x5555};
    long number[] = {0x55, -1, 0x55};
    int64 whole = -1;
    EXPECT_EQ(formatted(L"abc%hhnde%hnf%I64n%ln", &bytes[1], &half[1], &whole, &number[1]),
              "abcdef");
    EXPECT_THAT(bytes, testing::ElementsAre(0x55, 3, 0x55));
    EXPECT_THAT(half, testing::ElementsAre(0x5555, 5, 0x5555));
    EXPECT_EQ(whole, 6);
    EXPECT_THAT(number, testing::ElementsAre(0x55, 6, 0x55));
}

TEST(FormattedWrite, StoresItsCountInAnIntByAnyOtherSize) {
    int numbers[] = {-1, -1, -1, -1, -1};
    EXPECT_EQ(formatted(L"ab%I32nc%wnd%Lne", &numbers[0], &numbers[2], &numbers[4]), "abcde");
    EXPECT_THAT(numbers, testing::ElementsAre(2, -1, 3, -1, 4));
    int64 wide[] = {-1, -1};
    EXPECT_EQ(formatted(L"%%%jn%d%lln", &wide[0], 10, &wide[1]), "%10");
    EXPECT_THAT(wide, testing::ElementsAre(1, 3));
}

TEST(FormattedWrite, PutsAddressesInSixteenDigits) {
    const auto address = [](std::uintptr_t number) { return reinterpret_cast<void*>(number); };
    EXPECT_EQ(formatted(L"%p|%p", address(0), address(0x1F2E)),
              "0000000000000000|0000000000001F2E");
    EXPECT_EQ(formatted(L"%#p|%.3p", address(0xAB), address(1)),
              "00000000000000AB|0000000000000001");
    EXPECT_EQ(formatted(L"%18p|%-18p|", address(~std::uintptr_t{0}), address(1)),
              "  FFFFFFFFFFFFFFFF|0000000000000001  |");
    EXPECT_EQ(formatted(L"%018p|%+p|% p", address(2), address(3), address(4)),
              "  0000000000000002|0000000000000003|0000000000000004");
}

} // namespace
