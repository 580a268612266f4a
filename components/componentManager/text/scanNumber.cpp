// SPDX-License-Identifier: BSL-1.0
/// Parses the number in place, in the bytes that the standard buffer holds, and takes these bytes
/// only if it stores the number. The parser accepts only ordinary numbers that end inside these
/// bytes. Everything else is left to the general scanner, so there is one place that decides the
/// special cases.
#include "components/componentManager/text/scanNumber.h"

#include "components/componentManager/buffers/byteSource.h"
#include "components/componentManager/text/powersOfTen.h"
#include "components/componentManager/uid.h"

#include <algorithm>
#include <array>
#include <bit>
#include <charconv>
#include <cstddef>
#include <cstdint>
#include <cstring>
#include <string_view>
#include <system_error>

namespace Mz {

namespace {

enum class Target { None, Int, Short, Long, UnsignedLong, Int64, Float, Double };

/// Returns the target of a format that this file reads. The comparisons stop at the first character
/// that fits none, so an unsuccessful attempt is cheap.
Target targetOf(const wchar_t* format) {
    if (format[0] != L'%')
        return Target::None;
    switch (format[1]) {
    case L'd':
    case L'u': return format[2] ? Target::None : Target::Int;
    case L'g': return format[2] ? Target::None : Target::Float;
    case L'h':
        return (format[2] == L'd' || format[2] == L'u') && !format[3] ? Target::Short
                                                                      : Target::None;
    case L'l':
        if (!format[2] || format[3])
            return Target::None;
        return format[2] == L'g'   ? Target::Double
               : format[2] == L'd' ? Target::Long
               : format[2] == L'u' ? Target::UnsignedLong
                                   : Target::None;
    case L'I':
        return format[2] == L'6' && format[3] == L'4' && (format[4] == L'd' || format[4] == L'u') &&
                       !format[5]
                   ? Target::Int64
                   : Target::None;
    default: return Target::None;
    }
}

bool isReal(Target target) {
    return target == Target::Float || target == Target::Double;
}

/// At most this many bytes are parsed, more than white space and a number usually take: the general
/// scanner parses a longer text again, perhaps in small portions.
constexpr std::size_t windowSize = 64;

bool isSpace(char c) {
    return c == ' ' || (c >= '\t' && c <= '\r');
}

bool isDigit(char c) {
    return c >= '0' && c <= '9';
}

/// Returns the eight bytes at `at` as a number with the first one in its lowest byte.
std::uint64_t eightBytes(const char* at) {
    std::uint64_t bytes;
    std::memcpy(&bytes, at, sizeof bytes);
    return std::endian::native == std::endian::little ? bytes : __builtin_bswap64(bytes);
}

/// Returns the number that eight digits form, each a byte with the value of the digit, the first
/// one in the lowest byte. Combines neighbours: digits to pairs, pairs to fours, fours to eight.
std::uint64_t numberOf(std::uint64_t digits) {
    digits = (digits * 2561) >> 8 & 0x00FF00FF00FF00FF;     // 10 + 2^8
    digits = (digits * 6553601) >> 16 & 0x0000FFFF0000FFFF; // 100 + 2^16
    return (digits * 42949672960001) >> 32;                 // 10,000 + 2^32
}

/// A number in the window.
struct Number {
    bool negative = false;
    std::uint64_t digits = 0;    ///< the digits, without the point
    int exponent = 0;            ///< the power of ten by which they are multiplied
    const char* begin = nullptr; ///< after the sign
    const char* end = nullptr;
};

/// Up to this many digits always fit 64 bits. A number with more is unusual.
constexpr std::ptrdiff_t mostDigits = 18;

/// The powers of ten up to the count of digits that are taken at a time.
constexpr std::uint32_t integerPowers[] = {1,       10,        100,        1'000,      10'000,
                                           100'000, 1'000'000, 10'000'000, 100'000'000};

/// The powers of ten that a `double` represents exactly.
constexpr auto exactPowers = [] {
    std::array<double, 23> table{1};
    for (std::size_t index = 1; index < table.size(); ++index)
        table[index] = table[index - 1] * 10;
    return table;
}();

/// Appends the digits at `at` to `value`, up to eight at a time, and returns their end.
const char* takeDigits(const char* at, const char* end, std::uint64_t& value) {
    constexpr int width = 8;
    while (end - at >= width) {
        // A digit has its value in it, any other byte a larger one.
        const std::uint64_t digits = eightBytes(at) ^ 0x3030303030303030;
        const std::uint64_t others = ((digits + 0x7676767676767676) | digits) & 0x8080808080808080;
        const int count = std::countr_zero(others) / width;
        if (count == 0)
            return at;
        // Zeros before the digits take the place of what is no digit.
        value = value * integerPowers[count] + numberOf(digits << (width * (width - count)));
        at += count;
        if (count < width)
            return at;
    }
    for (; at != end && isDigit(*at); ++at)
        value = value * 10 + static_cast<std::uint64_t>(*at - '0');
    return at;
}

/// Reads the fraction and the exponent at `at` and returns their end, or null if they are unusual.
const char* takeFraction(const char* at, const char* end, Number& number) {
    if (at != end && *at == '.') {
        const char* const fraction = at + 1;
        at = takeDigits(fraction, end, number.digits);
        number.exponent = static_cast<int>(fraction - at);
    }
    if (at - number.begin > mostDigits + 1)
        return nullptr;
    if (at == end || (*at != 'e' && *at != 'E'))
        return at;
    ++at;
    const bool negative = at != end && *at == '-';
    if (at != end && (*at == '-' || *at == '+'))
        ++at;
    std::uint64_t exponent = 0;
    const char* const after = takeDigits(at, end, exponent);
    constexpr std::ptrdiff_t mostExponentDigits = 3;
    if (after == at || after - at > mostExponentDigits)
        return nullptr;
    number.exponent += negative ? -static_cast<int>(exponent) : static_cast<int>(exponent);
    return after;
}

/// Parses the number in the window. Returns false if it does not end there or is unusual.
bool parse(const char* at, const char* end, bool real, Number& number) {
    while (at != end && isSpace(*at))
        ++at;
    number.negative = at != end && *at == '-';
    if (at != end && (*at == '-' || *at == '+'))
        ++at;
    number.begin = at;
    at = takeDigits(at, end, number.digits);
    if (at == number.begin || at - number.begin > mostDigits)
        return false;
    if (real)
        at = takeFraction(at, end, number);
    number.end = at;
    // The next character must be in the window and ASCII: neither a NUL nor part of a multibyte
    // sequence.
    return at && at != end && *at > 0;
}

/// Computes the nearest `double` from one product with a power of ten. Returns false if the bits do
/// not show to which of two `double`s the product rounds, or if the result is not a normal number.
bool nearest(std::uint64_t digits, int power, double& value) {
    if (digits == 0 || power < smallestPowerOfTen || power > largestPowerOfTen)
        return false;
    const int leadingZeros = std::countl_zero(digits);
    const PowerOfTen& factor = powerOfTen(power);
    const UInt128 product = multiplied(digits << leadingZeros, factor);
    constexpr int mantissaBits = 52;
    const int top = product >> 127 ? 127 : 126;
    const int dropped = top - mantissaBits;
    const UInt128 fraction = product & ((UInt128{1} << dropped) - 1);
    const UInt128 half = UInt128{1} << (dropped - 1);
    if ((fraction > half ? fraction - half : half - fraction) < productError)
        return false;
    constexpr int bias = 1023;
    const int biased = factor.exponent - 63 - leadingZeros + top + bias;
    if (biased < 1 || biased >= 2 * bias)
        return false;
    // The highest bit of the mantissa adds one to the exponent, as a carry of the rounding does.
    const auto mantissa =
        static_cast<std::uint64_t>(product >> dropped) + (fraction > half ? 1 : 0);
    value =
        std::bit_cast<double>((static_cast<std::uint64_t>(biased - 1) << mantissaBits) + mantissa);
    return true;
}

/// Computes the value of the number. Returns false if it is too large or too small for a `double`.
bool valueOf(const Number& number, double& value) {
    constexpr std::uint64_t exactLimit = std::uint64_t(1) << 53;
    constexpr int exactPower = static_cast<int>(exactPowers.size()) - 1;
    if (number.digits <= exactLimit && number.exponent >= -exactPower &&
        number.exponent <= exactPower) {
        // Both operands are exact, so the single rounding is correct.
        const auto digits = static_cast<double>(number.digits);
        value = number.exponent < 0
                    ? digits / exactPowers[static_cast<std::size_t>(-number.exponent)]
                    : digits * exactPowers[static_cast<std::size_t>(number.exponent)];
    } else if (!nearest(number.digits, number.exponent, value) &&
               std::from_chars(number.begin, number.end, value).ec != std::errc()) {
        return false;
    }
    // Without a branch, since signs often alternate.
    const auto sign = static_cast<std::uint64_t>(number.negative) << 63;
    value = std::bit_cast<double>(std::bit_cast<std::uint64_t>(value) ^ sign);
    return true;
}

/// Stores the low bits, as many as the target has.
void storeInteger(Target target, std::uint64_t value, std::va_list& arguments) {
    const auto low = static_cast<std::uint32_t>(value);
    switch (target) {
    case Target::Int64: *va_arg(arguments, std::uint64_t*) = value; break;
    case Target::Short:
        *va_arg(arguments, std::uint16_t*) = static_cast<std::uint16_t>(value);
        break;
    case Target::Long: *va_arg(arguments, long*) = static_cast<std::int32_t>(low); break;
    case Target::UnsignedLong: *va_arg(arguments, unsigned long*) = low; break;
    default: *va_arg(arguments, std::uint32_t*) = low; break;
    }
}

bool store(Target target, const Number& number, std::va_list& arguments) {
    if (!isReal(target)) {
        storeInteger(target, number.negative ? 0 - number.digits : number.digits, arguments);
        return true;
    }
    double value = 0;
    if (!valueOf(number, value))
        return false;
    if (target == Target::Double)
        *va_arg(arguments, double*) = value;
    else
        *va_arg(arguments, float*) = static_cast<float>(value);
    return true;
}

/// Parses a number and takes its bytes if `store` accepts it. Returns their count, else 0.
template <class Store>
int scanAndStore(const ByteSource& source, bool real, const Store& store) {
    std::string_view window = source.held();
    if (window.empty()) [[unlikely]] {
        if (source.peek() < 0)
            return 0;
        window = source.held();
    }
    window = window.substr(0, windowSize);
    Number number;
    if (!parse(window.data(), window.data() + window.size(), real, number) || !store(number))
        return 0;
    const std::ptrdiff_t taken = number.end - window.data();
    source.take(taken);
    return static_cast<int>(taken);
}

template <class Integer>
int scanInteger(const ByteSource& source, Integer& value) {
    return scanAndStore(source, false, [&](const Number& number) {
        value = static_cast<Integer>(number.negative ? 0 - number.digits : number.digits);
        return true;
    });
}

} // namespace

int scanNumber(const ByteSource& source, const wchar_t* format, std::va_list& arguments) {
    const Target target = targetOf(format);
    if (target == Target::None)
        return 0;
    return scanAndStore(source, isReal(target),
                        [&](const Number& number) { return store(target, number, arguments); });
}

int scanNumber(const ByteSource& source, int& value) {
    return scanInteger(source, value);
}

int scanNumber(const ByteSource& source, unsigned int& value) {
    return scanInteger(source, value);
}

int scanNumber(const ByteSource& source, int64& value) {
    return scanInteger(source, value);
}

int scanNumber(const ByteSource& source, unsigned long long& value) {
    return scanInteger(source, value);
}

int scanNumber(const ByteSource& source, float& value) {
    return scanAndStore(source, true, [&](const Number& number) {
        double exact = 0;
        if (!valueOf(number, exact))
            return false;
        value = static_cast<float>(exact);
        return true;
    });
}

int scanNumber(const ByteSource& source, double& value) {
    return scanAndStore(source, true, [&](const Number& number) { return valueOf(number, value); });
}

} // namespace Mz
