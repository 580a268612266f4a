// SPDX-License-Identifier: BSL-1.0
/// Formats single numbers, two digits at a time. The 16 digits of a `double` come from one product
/// of its mantissa and a power of ten of 128 bits, whose error is known. Where the error could
/// change a digit, and for the other formats of floating-point numbers, the standard library
/// rounds.
#include "components/componentManager/text/numberText.h"

#include "components/componentManager/text/powersOfTen.h"
#include "components/componentManager/uid.h"

#include <algorithm>
#include <array>
#include <bit>
#include <charconv>
#include <cmath>
#include <cstdint>
#include <cstring>
#include <optional>
#include <type_traits>

namespace Mz {

namespace {

constexpr int digitsOfDouble = 16;

char* writeText(char* text, const char* other) {
    const std::size_t length = std::strlen(other);
    std::memcpy(text, other, length);
    return text + length;
}

/// "00", "01" and so on to "99".
constexpr auto digitPairs = [] {
    std::array<char, 200> table{};
    for (std::size_t pair = 0; pair < 100; ++pair) {
        table[2 * pair] = static_cast<char>('0' + pair / 10);
        table[2 * pair + 1] = static_cast<char>('0' + pair % 10);
    }
    return table;
}();

void writePair(char* text, std::uint64_t number) {
    std::memcpy(text, &digitPairs[static_cast<std::size_t>(2 * number)], 2);
}

/// The smallest number of each count of digits, from two on, at the index of one digit less.
template <class Unsigned>
constexpr auto digitLimits = [] {
    std::array<Unsigned, 20> table{}; // The first is 0, so that a zero has one digit.
    Unsigned power = 10;
    for (std::size_t index = 1; index < table.size(); ++index) {
        table[index] = power;
        const bool isLast = power > static_cast<Unsigned>(-1) / 10;
        power = isLast ? static_cast<Unsigned>(-1) : static_cast<Unsigned>(power * 10);
    }
    return table;
}();

/// Returns the number of digits of `value`.
template <class Unsigned>
int digitCount(Unsigned value) {
    // The number of bits times log10(2), which is at most one too small.
    const int estimate = static_cast<int>(std::bit_width(value | 1)) * 1233 >> 12;
    return estimate + (value >= digitLimits<Unsigned>[static_cast<std::size_t>(estimate)] ? 1 : 0);
}

/// Writes a number and no byte after it.
template <class Unsigned>
char* writeUnsigned(char* text, Unsigned value) {
    char* const end = text + digitCount(value);
    char* at = end;
    for (; value >= 100; value /= 100)
        writePair(at -= 2, value % 100);
    if (value >= 10)
        writePair(at - 2, value);
    else
        at[-1] = static_cast<char>('0' + value);
    return end;
}

template <class Integer>
char* writeInteger(char* text, Integer value) {
    using Unsigned = std::make_unsigned_t<Integer>;
    auto magnitude = static_cast<Unsigned>(value);
    if constexpr (std::is_signed_v<Integer>)
        if (value < 0) {
            *text++ = '-';
            magnitude = 0 - magnitude;
        }
    return writeUnsigned(text, magnitude);
}

/// Writes a zero, an infinity or a NaN.
char* writeSpecial(char* text, double value) {
    if (std::signbit(value))
        *text++ = '-';
    return writeText(text, std::isnan(value) ? "nan" : std::isinf(value) ? "inf" : "0");
}

/// Writes the text of `%.*g` by the standard library, which may change the bytes after the number.
char* writeRounded(char* text, double value, int digits) {
    if (!std::isfinite(value))
        return writeSpecial(text, value);
    char number[longestNumberText];
    const char* const end =
        std::to_chars(number, number + sizeof number, value, std::chars_format::general, digits)
            .ptr;
    const auto length = static_cast<std::size_t>(end - number);
    std::memcpy(text, number, length);
    return text + length;
}

/// A decimal number d.ddd…e±x: its digits without the point, and without trailing zeros.
struct Decimal {
    char digits[digitsOfDouble];
    int count = 0;
    int exponent = 0;
};

/// Returns `mantissa`, whose highest bit is set, times 2^`exponent` times 10^`power`, rounded to an
/// integer. Returns nothing if the bits do not show to which of two it rounds.
std::optional<std::uint64_t> scaled(std::uint64_t mantissa, int exponent, int power) {
    const PowerOfTen& factor = powerOfTen(power);
    const UInt128 product = multiplied(mantissa, factor);
    const int fractionBits = 63 - exponent - factor.exponent;
    const UInt128 fraction = product & ((UInt128{1} << fractionBits) - 1);
    const UInt128 half = UInt128{1} << (fractionBits - 1);
    const UInt128 distance = fraction > half ? fraction - half : half - fraction;
    if (distance < productError)
        return std::nullopt;
    return static_cast<std::uint64_t>(product >> fractionBits) + (fraction > half ? 1 : 0);
}

/// Writes the eight digits of `number`.
void writeEight(char* text, std::uint32_t number) {
    const std::uint32_t high = number / 10'000;
    const std::uint32_t low = number % 10'000;
    writePair(text, high / 100);
    writePair(text + 2, high % 100);
    writePair(text + 4, low / 100);
    writePair(text + 6, low % 100);
}

/// Stores the digits of `%.16g` of `value`, which is positive and finite. Returns false if they are
/// not certain.
bool sixteenDigits(Decimal& decimal, double value) {
    constexpr int mantissaBits = 52;
    constexpr int bias = 1023;
    const auto bits = std::bit_cast<std::uint64_t>(value);
    const int biased = static_cast<int>(bits >> mantissaBits);
    if (biased == 0)
        return false; // A subnormal number has fewer bits.
    const std::uint64_t mantissa = (bits << 11) | std::uint64_t{1} << 63;
    const int exponent = biased - bias - 63;
    // The decimal exponent, by log10(2): that of the power of two, so it is exact or one too small.
    decimal.exponent = ((biased - bias) * 315653) >> 20;
    constexpr std::uint64_t limit = 10'000'000'000'000'000;
    std::optional<std::uint64_t> digits =
        scaled(mantissa, exponent, digitsOfDouble - 1 - decimal.exponent);
    if (digits && *digits >= limit) {
        ++decimal.exponent;
        digits = scaled(mantissa, exponent, digitsOfDouble - 1 - decimal.exponent);
    }
    if (!digits)
        return false;
    constexpr std::uint64_t half = 100'000'000;
    writeEight(decimal.digits, static_cast<std::uint32_t>(*digits / half));
    writeEight(decimal.digits + 8, static_cast<std::uint32_t>(*digits % half));
    decimal.count = digitsOfDouble;
    while (decimal.count > 1 && decimal.digits[decimal.count - 1] == '0')
        --decimal.count;
    return true;
}

char* writeExponent(char* text, int exponent) {
    *text++ = 'e';
    *text++ = exponent < 0 ? '-' : '+';
    const int magnitude = std::abs(exponent);
    if (magnitude < 10)
        *text++ = '0';
    return writeInteger(text, magnitude);
}

char* writeDigits(char* text, const char* digits, int count) {
    std::memcpy(text, digits, static_cast<std::size_t>(count));
    return text + count;
}

/// Writes the digits in the layout of `%.16g`.
char* writeGeneral(char* text, const Decimal& decimal) {
    const auto& [digits, count, exponent] = decimal;
    if (exponent < -4 || exponent >= digitsOfDouble) {
        *text++ = digits[0];
        if (count > 1)
            *text++ = '.';
        return writeExponent(writeDigits(text, digits + 1, count - 1), exponent);
    }
    if (exponent < 0) {
        text = writeText(text, "0.");
        text = std::fill_n(text, -exponent - 1, '0');
        return writeDigits(text, digits, count);
    }
    const int whole = std::min(count, exponent + 1);
    text = writeDigits(text, digits, whole);
    text = std::fill_n(text, exponent + 1 - whole, '0');
    if (count > whole)
        *text++ = '.';
    return writeDigits(text, digits + whole, count - whole);
}

char* writeDouble(char* text, double value) {
    if (!std::isfinite(value) || value == 0)
        return writeSpecial(text, value);
    // Whole numbers of up to 15 digits, the most frequent values, need no search.
    constexpr double wholeLimit = 1e15;
    if (std::fabs(value) < wholeLimit && value == std::trunc(value))
        return writeInteger(text, static_cast<std::int64_t>(value));
    Decimal decimal;
    if (!sixteenDigits(decimal, std::fabs(value)))
        return writeRounded(text, value, digitsOfDouble);
    if (value < 0)
        *text++ = '-';
    return writeGeneral(text, decimal);
}

/// Writes a `long` if it fits 32 bits, its width on the streams of every platform.
template <class Narrow, class Wide>
NumberText writeLong(char*& text, Wide value) {
    if (static_cast<Wide>(static_cast<Narrow>(value)) != value)
        return NumberText::DoesNotFit;
    text = writeInteger(text, value);
    return NumberText::Written;
}

bool equals(const wchar_t* text, const wchar_t* other) {
    for (; *text == *other; ++text, ++other)
        if (!*text)
            return true;
    return false;
}

} // namespace

char* writeNumberText(char* text, int value) {
    return writeInteger(text, value);
}

char* writeNumberText(char* text, unsigned int value) {
    return writeInteger(text, value);
}

char* writeNumberText(char* text, int64 value) {
    return writeInteger(text, value);
}

char* writeNumberText(char* text, unsigned long long value) {
    return writeInteger(text, value);
}

char* writeNumberText(char* text, double value) {
    return writeDouble(text, value);
}

NumberText formatNumber(char*& text, const wchar_t* format, std::va_list& arguments) {
    if (format[0] != L'%')
        return NumberText::None;
    if (equals(format + 1, L"d"))
        text = writeInteger(text, va_arg(arguments, int));
    else if (equals(format + 1, L"u"))
        text = writeInteger(text, va_arg(arguments, unsigned int));
    else if (equals(format + 1, L".16g"))
        text = writeDouble(text, va_arg(arguments, double));
    else if (equals(format + 1, L".9g"))
        text = writeRounded(text, va_arg(arguments, double), 9);
    else if (equals(format + 1, L"I64d"))
        text = writeInteger(text, va_arg(arguments, int64));
    else if (equals(format + 1, L"I64u"))
        text = writeInteger(text, va_arg(arguments, unsigned long long));
    else if (equals(format + 1, L"ld"))
        return writeLong<std::int32_t>(text, va_arg(arguments, long));
    else if (equals(format + 1, L"lu"))
        return writeLong<std::uint32_t>(text, va_arg(arguments, unsigned long));
    else
        return NumberText::None;
    return NumberText::Written;
}

} // namespace Mz
