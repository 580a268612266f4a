// SPDX-License-Identifier: BSL-1.0
/// Copies what the standard buffer holds into a small window, parses the number there, and moves
/// the buffer back to its end: a few pointer moves in place of a call for each character. The
/// parser accepts only ordinary numbers that end inside the window. Everything else is put back for
/// the general scanner, so there is one place that decides the special cases.
#include "components/componentManager/text/scanNumber.h"

#include "components/componentManager/buffers/directBuffer.h"
#include "components/componentManager/uid.h"

#include <algorithm>
#include <array>
#include <charconv>
#include <cstddef>
#include <cstdint>
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

/// Returns the size of the window: white space, the longest number that streams write, and the
/// character after it. Not more, because every unneeded character must be put back.
int windowOf(Target target) {
    constexpr int real = 28;
    constexpr int longInteger = 23;
    constexpr int integer = 14;
    return isReal(target) ? real : target == Target::Int64 ? longInteger : integer;
}

bool isSpace(char c) {
    return c == ' ' || (c >= '\t' && c <= '\r');
}

bool isDigit(char c) {
    return c >= '0' && c <= '9';
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

const char* takeDigits(const char* at, const char* end, std::uint64_t& value) {
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

/// Computes the value of the number. Returns false if it is too large or too small for a `double`.
bool valueOf(const Number& number, double& value) {
    constexpr auto powers = [] {
        std::array<double, 23> table{1};
        for (std::size_t index = 1; index < table.size(); ++index)
            table[index] = table[index - 1] * 10;
        return table;
    }();
    constexpr std::uint64_t exactLimit = std::uint64_t(1) << 53;
    constexpr int exactPower = static_cast<int>(powers.size()) - 1;
    if (number.digits <= exactLimit && number.exponent >= -exactPower &&
        number.exponent <= exactPower) {
        // Both operands are exact, so the single rounding is correct.
        const auto digits = static_cast<double>(number.digits);
        value = number.exponent < 0 ? digits / powers[static_cast<std::size_t>(-number.exponent)]
                                    : digits * powers[static_cast<std::size_t>(number.exponent)];
    } else if (std::from_chars(number.begin, number.end, value).ec != std::errc()) {
        return false;
    }
    if (number.negative)
        value = -value;
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

} // namespace

bool scanNumber(std::istream& in, std::streambuf& buffer, const wchar_t* format,
                std::va_list& arguments) {
    const Target target = targetOf(format);
    if (target == Target::None)
        return false;
    // Characters in the buffer are read and put back by moving a pointer. A single one may be a
    // putback character, which buffers keep elsewhere.
    constexpr std::streamsize fewest = 2;
    char window[32];
    std::streamsize got = 0;
    directly(in, [&] {
        // Fills the buffer first: if it is empty, `in_avail` only estimates the rest of the medium.
        if (buffer.sgetc() == std::streambuf::traits_type::eof())
            return true;
        const std::streamsize available = buffer.in_avail();
        if (available >= fewest)
            got = buffer.sgetn(window, std::min<std::streamsize>(available, windowOf(target)));
        return true;
    });
    if (in.bad()) [[unlikely]]
        throwBrokenInput();
    Number number;
    const bool scanned =
        parse(window, window + got, isReal(target), number) && store(target, number, arguments);
    for (const char* at = window + got; at != (scanned ? number.end : window); --at)
        buffer.sungetc();
    return scanned;
}

} // namespace Mz
