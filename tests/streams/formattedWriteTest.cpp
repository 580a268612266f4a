// SPDX-License-Identifier: BSL-1.0
// Tests the conversions of formattedWrite against the expected texts.
#include "tests/streams/support.h"

#include <gmock/gmock.h>

#include <cmath>
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
}

TEST(FormattedWrite, LiteralsAndPercentSigns) {
    EXPECT_EQ(formatted(L""), "");
    EXPECT_EQ(formatted(L"100%% sure\n"), "100% sure\n");
    EXPECT_EQ(formatted(L"%y|%5!"), "%y|%5!");
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
    int64 whole = -1;
    EXPECT_EQ(formatted(L"abc%hhnde%hnf%I64n", &bytes[1], &half[1], &whole), "abcdef");
    EXPECT_THAT(bytes, testing::ElementsAre(0x55, 3, 0x55));
    EXPECT_THAT(half, testing::ElementsAre(0x5555, 5, 0x5555));
    EXPECT_EQ(whole, 6);
    long words[] = {0x55, -1, 0x55};
    EXPECT_EQ(formatted(L"ab%ln", &words[1]), "ab");
    EXPECT_THAT(words, testing::ElementsAre(0x55, 2, 0x55));
}

TEST(FormattedWrite, WritesAnAddressInSixteenCapitalDigits) {
    const auto address = reinterpret_cast<void*>(std::uintptr_t{0x12AB});
    EXPECT_EQ(formatted(L"%p", address), "00000000000012AB");
    EXPECT_EQ(formatted(L"%#20p|", address), "    00000000000012AB|") << "without a prefix";
    EXPECT_EQ(formatted(L"%-18.3p|", address), "00000000000012AB  |") << "whatever the precision";
    EXPECT_EQ(formatted(L"%p", static_cast<void*>(nullptr)), "0000000000000000");
}

} // namespace
