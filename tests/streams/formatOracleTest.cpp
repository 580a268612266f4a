// SPDX-License-Identifier: BSL-1.0
// Compares random formats and inputs with the C library.
#include "tests/streams/commaLocale.h"
#include "tests/streams/oracle.h"
#include "tests/streams/support.h"

#include <gtest/gtest.h>

#include <random>

namespace {

using namespace Mz::Test;
using Mz::int64;
using Mz::QrTextStream;

std::wstring widened(const std::string& text) {
    std::wstring wide;
    for (const char c : text)
        wide += static_cast<wchar_t>(static_cast<unsigned char>(c));
    return wide;
}

class Random {
  public:
    explicit Random(unsigned int seed) : engine(seed) {}
    unsigned int below(unsigned int limit) { return static_cast<unsigned int>(engine()) % limit; }
    bool chance() { return below(2) == 1; }
    std::uint64_t bits() { return std::uint64_t{engine()} << 32 | engine(); }
    /// Returns a number of a random length.
    std::uint64_t number() { return bits() >> below(64); }
    template <std::size_t Size>
    wchar_t oneOf(const wchar_t (&set)[Size]) {
        return set[below(Size - 1)];
    }
    std::string text(std::string_view alphabet, unsigned int longest) {
        std::string result;
        for (unsigned int length = below(longest + 1); length > 0; --length)
            result += alphabet[below(static_cast<unsigned int>(alphabet.size()))];
        return result;
    }

  private:
    std::mt19937 engine;
};

constexpr int rounds = MZ_RANDOM_VALUES / 40;

/// Returns a random directive without its size and conversion: flags from `flags`, width,
/// precision.
std::wstring directive(Random& random, std::wstring_view flags, unsigned int longestPrecision) {
    std::wstring result = L"%";
    const bool precise = longestPrecision > 0 && random.chance();
    for (const wchar_t flag : flags)
        if (random.below(4) == 0)
            result += flag;
    if (random.chance())
        result += std::to_wstring(random.below(30) + 1);
    if (precise)
        result += L"." + std::to_wstring(random.below(longestPrecision + 1));
    return result;
}

template <class... Arguments>
void expectPrintedAlike(const std::wstring& format, Arguments... arguments) {
    Writing<QrTextStream> out;
    out.stream.formattedWrite(format.c_str(), arguments...);
    // The C library formats in the "C" locale, whatever locale the test has set.
    const std::string previous = std::setlocale(LC_ALL, nullptr);
    std::setlocale(LC_ALL, "C");
    const std::wstring wanted = oraclePrint(format.c_str(), arguments...);
    std::setlocale(LC_ALL, previous.c_str());
    EXPECT_EQ(widened(out.bytes()), wanted) << testing::PrintToString(format);
}

void printAlike(unsigned int seed) {
    // One C library overflows its buffer when zeros fill a width or a precision.
    const unsigned int longest = oracleFollowsTheStandard ? 25 : 0;
    const std::wstring_view signedFlags = oracleFollowsTheStandard ? L"-+ 0" : L"-+ ";
    const std::wstring_view unsignedFlags = oracleFollowsTheStandard ? L"-#0" : L"-";
    Random random(seed);
    for (int round = 0; round < rounds && !testing::Test::HasFailure(); ++round) {
        const bool isSigned = random.chance();
        const std::wstring start =
            directive(random, isSigned ? signedFlags : unsignedFlags, longest);
        const wchar_t conversion = isSigned ? random.oneOf(L"di") : random.oneOf(L"uoxX");
        switch (random.below(4)) {
        case 0:
            expectPrintedAlike(L"a" + start + L"I64" + conversion + L"z",
                               static_cast<int64>(random.number()));
            break;
        case 1: // The library uses the low 16 bits.
            expectPrintedAlike(start + L"h" + conversion, static_cast<int>(random.number()));
            break;
        default: expectPrintedAlike(start + conversion, static_cast<int>(random.number()));
        }
        const std::wstring text = widened(random.text("abc xyz", 12));
        expectPrintedAlike(directive(random, L"-", 12) + L"s", text.c_str());
        if (!oracleFollowsTheStandard)
            continue;
        const auto real = random.chance() ? std::bit_cast<double>(random.bits())
                                          : static_cast<double>(random.number()) / 1024.0;
        expectPrintedAlike(directive(random, L"-+ #0", 25) + random.oneOf(L"eEfFgGaA"), real);
    }
}

TEST(FormatOracle, IntegersTextsAndRealNumbersPrintAsTheCLibraryPrintsThem) {
    printAlike(1);
}

TEST(FormatOracle, TheyPrintTheSameUnderACommaLocale) {
    const CommaLocale locale;
    if (!locale)
        GTEST_SKIP() << "no comma-decimal locale here";
    printAlike(2);
    EXPECT_STREQ(std::localeconv()->decimal_point, ",");
}

/// Returns whether C libraries differ from the standard, and from each other, for the input: it has
/// a "0x" or an exponent without digits.
bool isContested(const std::string& input, bool limited) {
    for (std::size_t at = input.find_first_of("xXeE"); at != std::string::npos;
         at = input.find_first_of("xXeE", at + 1)) {
        std::size_t next = at + 1;
        const bool exponent = input[at] == 'e' || input[at] == 'E';
        if (exponent && next < input.size() && (input[next] == '+' || input[next] == '-'))
            ++next;
        const std::string_view digits = exponent ? "0123456789" : "0123456789abcdefABCDEF";
        if (limited || next >= input.size() || digits.find(input[next]) == std::string_view::npos)
            return true;
    }
    return false;
}

/// Reads a value with both scanners and compares the value and the number of characters used.
template <class T>
void expectScannedAlike(const std::string& input, const std::wstring& format) {
    T ours[40]{};
    T theirs[40]{};
    int ourCount = -1;
    int theirCount = -1;
    Reading<QrTextStream> in(input);
    const int ourResult = in.stream.formattedRead((format + L"%n").c_str(), &ours[0], &ourCount);
    const std::string previous = std::setlocale(LC_ALL, nullptr);
    std::setlocale(LC_ALL, "C");
    const int theirResult =
        oracleScan(widened(input), (format + L"%n").c_str(), &theirs[0], &theirCount);
    std::setlocale(LC_ALL, previous.c_str());
    SCOPED_TRACE("\"" + input + "\" by " + testing::PrintToString(format));
    EXPECT_EQ(ourResult, theirResult);
    EXPECT_EQ(ourCount, theirCount);
    for (std::size_t index = 0; index < 40; ++index)
        EXPECT_EQ(ours[index], theirs[index]) << index;
    if (ourCount >= 0) {
        EXPECT_EQ(in.rest(), input.substr(static_cast<std::size_t>(ourCount)));
    }
}

std::wstring width(Random& random, bool& limited) {
    limited = random.below(3) == 0;
    return limited ? std::to_wstring(random.below(8) + 1) : L"";
}

void scanNumber(Random& random) {
    bool limited = false;
    const std::wstring taken = width(random, limited);
    // Short enough not to overflow: C libraries differ in what they do then.
    std::string input = random.text(" \n", 2) + random.text("+-", 1) +
                        (random.chance() ? "0x" : "") + random.text("0123456789abcdefABCDEF8", 7) +
                        random.text("gz-+. 0", 3);
    if (random.below(4) == 0)
        input = random.text(" +-0123789xXg\t", 9);
    const wchar_t conversion = random.oneOf(L"duoxi");
    if (isContested(input, limited) && input.find_first_of("xX") != std::string::npos)
        return;
    switch (random.below(3)) {
    case 0: expectScannedAlike<int64>(input, L"%" + taken + L"I64" + conversion); break;
    case 1: expectScannedAlike<short>(input, L"%" + taken + L"h" + conversion); break;
    default: expectScannedAlike<int>(input, L"%" + taken + conversion);
    }
}

void scanText(Random& random) {
    bool limited = false;
    const std::wstring taken = width(random, limited);
    const std::string input = random.text("abcx-] \n\t", 20);
    static const std::wstring sets[] = {L"[abc]", L"[^abc]", L"[a-c]",  L"[]a-c]", L"[^]-]",
                                        L"[-a]",  L"[ab-]",  L"[^ \n]", L"[a-bx]"};
    switch (random.below(3)) {
    case 0: expectScannedAlike<wchar_t>(input, L"%" + taken + L"s"); break;
    case 1: expectScannedAlike<wchar_t>(input, L"%" + taken + L"c"); break;
    default: expectScannedAlike<wchar_t>(input, L"%" + taken + sets[random.below(std::size(sets))]);
    }
}

void scanReal(Random& random) {
    const std::string input =
        random.text(" \n", 1) + random.text("+-", 1) + random.text("0123456789", 12) +
        random.text(".", 1) + random.text("0123456789", 18) + random.text("e", 1) +
        random.text("+-", 1) + random.text("0123456789", 3) + random.text(",x. ", 2);
    if (isContested(input, false))
        return;
    expectScannedAlike<double>(input, L"%lg");
}

void scanAlike(unsigned int seed) {
    Random random(seed);
    for (int round = 0; round < rounds && !testing::Test::HasFailure(); ++round) {
        scanNumber(random);
        scanText(random);
        if (oracleFollowsTheStandard)
            scanReal(random);
    }
}

TEST(FormatOracle, NumbersAndTextsScanAsTheCLibraryScansThem) {
    scanAlike(3);
}

TEST(FormatOracle, TheyScanTheSameUnderACommaLocale) {
    const CommaLocale locale;
    if (!locale)
        GTEST_SKIP() << "no comma-decimal locale here";
    scanAlike(4);
    EXPECT_STREQ(std::localeconv()->decimal_point, ",");
}

} // namespace
