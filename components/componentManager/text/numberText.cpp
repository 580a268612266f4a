// SPDX-License-Identifier: BSL-1.0
/// Formats single numbers into a small buffer. The 16 digits of a `double` take most of the time:
/// the standard library finds the fewest digits that read back much faster than any fixed number of
/// them. So these are used where they provably are, or round to, the digits of `%.16g`. The other
/// values take the standard library's rounding.
#include "components/componentManager/text/numberText.h"

#include "components/componentManager/uid.h"

#include <algorithm>
#include <array>
#include <charconv>
#include <cmath>
#include <cstdint>
#include <cstring>
#include <limits>

namespace Mz {

namespace {

constexpr int digitsOfDouble = 16;

char* writeText(char* text, const char* other) {
    const std::size_t length = std::strlen(other);
    std::memcpy(text, other, length);
    return text + length;
}

template <class Integer>
char* writeInteger(char* text, Integer value) {
    return std::to_chars(text, text + longestNumberText, value).ptr;
}

/// Writes a zero, an infinity or a NaN.
char* writeSpecial(char* text, double value) {
    if (std::signbit(value))
        *text++ = '-';
    return writeText(text, std::isnan(value) ? "nan" : std::isinf(value) ? "inf" : "0");
}

/// Writes the text of `%.*g` by the standard library.
char* writeRounded(char* text, double value, int digits) {
    if (!std::isfinite(value))
        return writeSpecial(text, value);
    return std::to_chars(text, text + longestNumberText, value, std::chars_format::general, digits)
        .ptr;
}

/// A decimal number d.ddd…e±x: its digits without the point, and without trailing zeros.
struct Decimal {
    char digits[24];
    int count = 0;
    int exponent = 0;
};

/// Returns the fewest digits that read back as `value`, which is positive and finite.
Decimal shortest(double value) {
    char text[32];
    const char* const end =
        std::to_chars(text, text + sizeof text, value, std::chars_format::scientific).ptr;
    const char* mark = end - 4; // "d.ddde-123", "d.ddde+12" or "de+12"
    while (*mark != 'e')
        --mark;
    Decimal decimal;
    decimal.count = static_cast<int>(std::max<std::ptrdiff_t>(mark - text - 1, 1));
    decimal.digits[0] = text[0];
    std::memcpy(decimal.digits + 1, text + 2, sizeof decimal.digits - 1);
    for (const char* at = mark + 2; at != end; ++at)
        decimal.exponent = decimal.exponent * 10 + (*at - '0');
    if (mark[1] == '-')
        decimal.exponent = -decimal.exponent;
    return decimal;
}

void dropZeros(Decimal& decimal) {
    while (decimal.count > 1 && decimal.digits[decimal.count - 1] == '0')
        --decimal.count;
}

/// Rounds 17 digits to 16. Returns false if the last one is a 5: the number itself may be on either
/// side of the middle.
bool dropLastDigit(Decimal& decimal) {
    const char last = decimal.digits[--decimal.count];
    if (last == '5')
        return false;
    if (last > '5') {
        int index = decimal.count;
        while (index > 0 && decimal.digits[index - 1] == '9')
            decimal.digits[--index] = '0';
        if (index == 0) {
            decimal.digits[0] = '1';
            ++decimal.exponent;
        } else {
            ++decimal.digits[index - 1];
        }
    }
    dropZeros(decimal);
    return true;
}

using Wide = long double;

/// The powers of ten that a `long double` of 64 bits holds exactly.
constexpr auto powersOfTen = [] {
    std::array<Wide, 28> powers{1};
    for (std::size_t index = 1; index < powers.size(); ++index)
        powers[index] = powers[index - 1] * 10;
    return powers;
}();

/// Whether this thread computes with all bits of the type. On Windows the precision depends on the
/// code that started the thread.
bool hasFullPrecision() {
    if (std::numeric_limits<Wide>::digits < 64)
        return false;
    const volatile Wide one = 1;
    const volatile Wide finest = std::numeric_limits<Wide>::epsilon();
    return (one + finest) - one == finest;
}

/// Whether no other number of 16 digits is nearer to `value` than this one of fewer digits. False
/// if that is not certain.
bool isNearest(const Decimal& decimal, double value) {
    // With full precision the distance is a thousand times finer than needed.
    if (!hasFullPrecision())
        return false;
    const int scale = decimal.count - 1 - decimal.exponent;
    if (scale < 0 || static_cast<std::size_t>(scale) >= powersOfTen.size())
        return false;
    std::uint64_t number = 0;
    std::from_chars(decimal.digits, decimal.digits + decimal.count, number);
    const Wide scaled = static_cast<Wide>(value) * powersOfTen[static_cast<std::size_t>(scale)];
    const Wide distance = std::fabs(scaled - static_cast<Wide>(number));
    // The distance in units of the 16th digit: below half a unit, this number is the nearest. Below
    // a power of ten the units are smaller.
    const int missing = digitsOfDouble - decimal.count + (number == 1 ? 1 : 0);
    return distance * powersOfTen[static_cast<std::size_t>(missing)] < Wide(0.49);
}

/// Stores the digits of `%.16g` if they follow from the fewest that read back, else returns false.
bool sixteenDigits(Decimal& decimal, double value) {
    decimal = shortest(value);
    if (decimal.count < digitsOfDouble)
        return isNearest(decimal, value);
    std::uint64_t bits;
    std::memcpy(&bits, &value, sizeof bits);
    constexpr std::uint64_t fraction = (std::uint64_t(1) << 52) - 1;
    // Only at a power of two do the neighbours have different distances. The nearest number of 16
    // digits may then be one that does not read back.
    if (!(bits & fraction))
        return false;
    // Of several shortest numbers `std::to_chars` returns the nearest, so 16 digits are the result.
    return decimal.count == digitsOfDouble || dropLastDigit(decimal);
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
