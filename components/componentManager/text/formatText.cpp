// SPDX-License-Identifier: BSL-1.0
/// A formatter that parses the wide `printf` formats itself. The C libraries differ between
/// platforms in `%s`, exponents and the width of a `long`, depend on the locale, and limit the
/// length of the output. `std::to_chars` supplies the digits of floating-point numbers: it rounds
/// correctly and ignores the locale.
#include "components/componentManager/text/formatText.h"

#include "components/componentManager/uid.h"

#include <algorithm>
#include <charconv>
#include <cmath>
#include <cstdint>
#include <cwchar>
#include <limits>
#include <string_view>
#include <type_traits>
#include <vector>

namespace Mz {

namespace {

enum class Size { None, Byte, Short, Long, Wide, Int64, LongDouble };

struct Directive {
    bool left = false;
    bool plus = false;
    bool blank = false;
    bool alternate = false;
    bool zero = false;
    std::size_t width = 0;
    int precision = -1;
    Size size = Size::None;
    wchar_t conversion = 0;
};

bool isDigit(wchar_t c) {
    return c >= L'0' && c <= L'9';
}

/// Reads a run of digits. The number is clamped, so that it does not overflow.
int takeNumber(const wchar_t*& format) {
    constexpr int limit = std::numeric_limits<int>::max() / 16;
    int number = 0;
    for (; isDigit(*format); ++format)
        number = number < limit ? number * 10 + (*format - L'0') : number;
    return number;
}

void parseFlags(const wchar_t*& format, Directive& directive) {
    for (;; ++format)
        switch (*format) {
        case L'-': directive.left = true; break;
        case L'+': directive.plus = true; break;
        case L' ': directive.blank = true; break;
        case L'#': directive.alternate = true; break;
        case L'0': directive.zero = true; break;
        default: return;
        }
}

bool take(const wchar_t*& format, std::wstring_view text) {
    if (std::wcsncmp(format, text.data(), text.size()) != 0)
        return false;
    format += text.size();
    return true;
}

Size parseSize(const wchar_t*& format) {
    if (take(format, L"hh"))
        return Size::Byte;
    if (take(format, L"h"))
        return Size::Short;
    if (take(format, L"I32"))
        return Size::None;
    if (take(format, L"ll") || take(format, L"I64") || take(format, L"I") || take(format, L"z") ||
        take(format, L"t") || take(format, L"j"))
        return Size::Int64;
    if (take(format, L"l"))
        return Size::Long;
    if (take(format, L"w"))
        return Size::Wide;
    if (take(format, L"L"))
        return Size::LongDouble;
    return Size::None;
}

/// Appends sign, prefix and digits, padded to the width of the directive.
void appendPadded(std::wstring& result, const Directive& directive, std::wstring_view prefix,
                  std::wstring_view body, bool zeros) {
    const std::size_t length = prefix.size() + body.size();
    const std::size_t padding = directive.width > length ? directive.width - length : 0;
    if (!directive.left && !zeros)
        result.append(padding, L' ');
    result.append(prefix);
    if (!directive.left && zeros)
        result.append(padding, L'0');
    result.append(body);
    if (directive.left)
        result.append(padding, L' ');
}

const wchar_t* signOf(const Directive& directive, bool negative) {
    if (negative)
        return L"-";
    return directive.plus ? L"+" : directive.blank ? L" " : L"";
}

std::wstring digitsOf(std::uint64_t value, unsigned int base, bool upperCase) {
    const wchar_t* symbols = upperCase ? L"0123456789ABCDEF" : L"0123456789abcdef";
    std::wstring digits;
    for (; value; value /= base)
        digits.insert(digits.begin(), symbols[value % base]);
    return digits;
}

void appendInteger(std::wstring& result, const Directive& directive, std::uint64_t magnitude,
                   bool negative) {
    const wchar_t conversion = directive.conversion;
    const bool isSigned = conversion == L'd' || conversion == L'i';
    const bool isHexadecimal = conversion == L'x' || conversion == L'X';
    const unsigned int base = isHexadecimal ? 16 : conversion == L'o' ? 8 : 10;
    std::wstring digits = digitsOf(magnitude, base, conversion == L'X');
    const auto wanted = static_cast<std::size_t>(directive.precision < 0 ? 1 : directive.precision);
    if (digits.size() < wanted)
        digits.insert(0, wanted - digits.size(), L'0');
    if (directive.alternate && base == 8 && !digits.starts_with(L'0'))
        digits.insert(0, 1, L'0');
    std::wstring prefix = isSigned ? signOf(directive, negative) : L"";
    if (directive.alternate && isHexadecimal && magnitude)
        prefix += conversion == L'X' ? L"0X" : L"0x";
    appendPadded(result, directive, prefix, digits, directive.zero && directive.precision < 0);
}

/// Returns false if a `long` does not fit 32 bits, its width on the streams of every platform.
bool formatSigned(std::wstring& result, const Directive& directive, std::va_list& arguments) {
    int64 value = 0;
    switch (directive.size) {
    case Size::Int64: value = va_arg(arguments, int64); break;
    case Size::Long:
        value = va_arg(arguments, long);
        if (value != static_cast<std::int32_t>(value))
            return false;
        break;
    case Size::Short: value = static_cast<short>(va_arg(arguments, int)); break;
    case Size::Byte: value = static_cast<signed char>(va_arg(arguments, int)); break;
    default: value = va_arg(arguments, int); break;
    }
    const auto bits = static_cast<std::uint64_t>(value);
    appendInteger(result, directive, value < 0 ? 0 - bits : bits, value < 0);
    return true;
}

bool formatUnsigned(std::wstring& result, const Directive& directive, std::va_list& arguments) {
    std::uint64_t value = 0;
    switch (directive.size) {
    case Size::Int64: value = va_arg(arguments, unsigned long long); break;
    case Size::Long:
        value = va_arg(arguments, unsigned long);
        if (value != static_cast<std::uint32_t>(value))
            return false;
        break;
    case Size::Short: value = static_cast<unsigned short>(va_arg(arguments, unsigned int)); break;
    case Size::Byte: value = static_cast<unsigned char>(va_arg(arguments, unsigned int)); break;
    default: value = va_arg(arguments, unsigned int); break;
    }
    appendInteger(result, directive, value, false);
    return true;
}

/// Returns the digits of a finite, non-negative value.
template <class Float>
std::string toCharacters(Float value, std::chars_format format, int precision) {
    // The longest fixed form has as many digits before its point as the largest value.
    std::vector<char> buffer(static_cast<std::size_t>(std::numeric_limits<Float>::max_exponent10) +
                             static_cast<std::size_t>(precision) + 16);
    const auto end = buffer.data() + buffer.size();
    const std::to_chars_result written =
        precision < 0 ? std::to_chars(buffer.data(), end, value, format)
                      : std::to_chars(buffer.data(), end, value, format, precision);
    return {buffer.data(), written.ptr};
}

int exponentOf(const std::string& scientific) {
    const std::size_t mark = scientific.find('e');
    const char* digits = scientific.data() + mark + (scientific[mark + 1] == '+' ? 2 : 1);
    int exponent = 0;
    std::from_chars(digits, scientific.data() + scientific.size(), exponent);
    return exponent;
}

/// Returns the text of `%#g`: that of `%g` with the trailing zeros, which `std::to_chars` omits.
template <class Float>
std::string toGeneralWithZeros(Float value, int precision) {
    const int digits = precision == 0 ? 1 : precision;
    std::string scientific = toCharacters(value, std::chars_format::scientific, digits - 1);
    const int exponent = exponentOf(scientific);
    if (exponent < -4 || exponent >= digits)
        return scientific;
    return toCharacters(value, std::chars_format::fixed, digits - 1 - exponent);
}

/// Inserts the decimal point that the alternate form requires, if there is none. Looks for the
/// exponent from the end: the digit before it may be a hexadecimal "e".
void ensurePoint(std::string& digits) {
    if (digits.find('.') == std::string::npos)
        digits.insert(std::min(digits.find_last_of("ep"), digits.size()), 1, '.');
}

template <class Float>
std::string finiteDigits(const Directive& directive, wchar_t conversion, Float value) {
    const int precision = directive.precision < 0 ? 6 : directive.precision;
    std::string digits;
    switch (conversion) {
    case L'e': digits = toCharacters(value, std::chars_format::scientific, precision); break;
    case L'f': digits = toCharacters(value, std::chars_format::fixed, precision); break;
    case L'a': digits = toCharacters(value, std::chars_format::hex, directive.precision); break;
    default:
        digits = directive.alternate ? toGeneralWithZeros(value, precision)
                                     : toCharacters(value, std::chars_format::general, precision);
    }
    if (directive.alternate)
        ensurePoint(digits);
    return digits;
}

/// Requires a letter.
wchar_t toLower(wchar_t c) {
    return c <= L'Z' ? static_cast<wchar_t>(c + (L'a' - L'A')) : c;
}

/// Requires a character of a number, none of which is above 'z'.
wchar_t toUpper(wchar_t c) {
    return c >= L'a' ? static_cast<wchar_t>(c - (L'a' - L'A')) : c;
}

template <class Float>
void appendFloat(std::wstring& result, const Directive& directive, Float value) {
    const wchar_t conversion = toLower(directive.conversion);
    const bool upperCase = conversion != directive.conversion;
    const bool finite = std::isfinite(value);
    std::wstring prefix = signOf(directive, std::signbit(value));
    if (finite && conversion == L'a')
        prefix += L"0x";
    const std::string text = finite ? finiteDigits(directive, conversion, std::fabs(value))
                                    : std::string(std::isnan(value) ? "nan" : "inf");
    std::wstring body(text.begin(), text.end());
    if (upperCase) {
        for (wchar_t& c : prefix)
            c = toUpper(c);
        for (wchar_t& c : body)
            c = toUpper(c);
    }
    appendPadded(result, directive, prefix, body, directive.zero && finite);
}

void formatFloat(std::wstring& result, const Directive& directive, std::va_list& arguments) {
    if (directive.size == Size::LongDouble)
        appendFloat(result, directive, va_arg(arguments, long double));
    else
        appendFloat(result, directive, va_arg(arguments, double));
}

/// Whether a string or character is wide: `s` and `c` are, unless a size specifies otherwise.
bool isWide(const Directive& directive) {
    if (directive.size == Size::Short || directive.size == Size::Byte)
        return false;
    if (directive.size == Size::Long || directive.size == Size::Wide)
        return true;
    return directive.conversion == L's' || directive.conversion == L'c';
}

/// Copies a string up to its end or the precision, and reads no further: with a precision it need
/// not be terminated.
template <class Character>
std::wstring copyText(const Character* text, int precision) {
    if (!text)
        return copyText(L"(null)", precision);
    std::wstring copy;
    for (; precision != 0 && *text; ++text, precision -= precision > 0 ? 1 : 0)
        copy += static_cast<wchar_t>(static_cast<std::make_unsigned_t<Character>>(*text));
    return copy;
}

void formatString(std::wstring& result, const Directive& directive, std::va_list& arguments) {
    const std::wstring text = isWide(directive)
                                  ? copyText(va_arg(arguments, const wchar_t*), directive.precision)
                                  : copyText(va_arg(arguments, const char*), directive.precision);
    appendPadded(result, directive, L"", text, directive.zero);
}

void formatCharacter(std::wstring& result, const Directive& directive, std::va_list& arguments) {
    const int code = va_arg(arguments, int);
    const wchar_t character =
        isWide(directive) ? static_cast<wchar_t>(code) : static_cast<unsigned char>(code);
    appendPadded(result, directive, L"", {&character, 1}, directive.zero);
}

void formatPointer(std::wstring& result, Directive directive, std::va_list& arguments) {
    const auto address = reinterpret_cast<std::uintptr_t>(va_arg(arguments, void*));
    directive.conversion = L'X';
    directive.precision = 16;
    directive.alternate = false;
    appendInteger(result, directive, address, false);
}

void storeCount(const Directive& directive, std::size_t count, std::va_list& arguments) {
    switch (directive.size) {
    case Size::Int64: *va_arg(arguments, int64*) = static_cast<int64>(count); break;
    case Size::Long: *va_arg(arguments, long*) = static_cast<long>(count); break;
    case Size::Short: *va_arg(arguments, short*) = static_cast<short>(count); break;
    case Size::Byte: *va_arg(arguments, signed char*) = static_cast<signed char>(count); break;
    default: *va_arg(arguments, int*) = static_cast<int>(count); break;
    }
}

void parseWidth(const wchar_t*& format, Directive& directive, std::va_list& arguments) {
    if (!take(format, L"*")) {
        directive.width = static_cast<std::size_t>(takeNumber(format));
        return;
    }
    const int64 width = va_arg(arguments, int);
    directive.left = directive.left || width < 0;
    directive.width = static_cast<std::size_t>(width < 0 ? -width : width);
}

void parsePrecision(const wchar_t*& format, Directive& directive, std::va_list& arguments) {
    if (!take(format, L"."))
        return;
    // A negative precision counts as none.
    directive.precision = take(format, L"*") ? va_arg(arguments, int) : takeNumber(format);
    if (directive.precision < 0)
        directive.precision = -1;
}

/// Formats the directive at `format`, which begins after the '%', and moves `format` to its end.
/// The text of this call begins at `start` in `result`. Returns false as `formatText`.
bool formatDirective(std::wstring& result, std::size_t start, const wchar_t*& format,
                     std::va_list& arguments) {
    const wchar_t* begin = format;
    Directive directive;
    parseFlags(format, directive);
    parseWidth(format, directive, arguments);
    parsePrecision(format, directive, arguments);
    directive.size = parseSize(format);
    directive.conversion = *format;
    if (!directive.conversion)
        return false;
    ++format;
    switch (directive.conversion) {
    case L'd':
    case L'i': return formatSigned(result, directive, arguments);
    case L'u':
    case L'o':
    case L'x':
    case L'X': return formatUnsigned(result, directive, arguments);
    case L'e':
    case L'E':
    case L'f':
    case L'F':
    case L'g':
    case L'G':
    case L'a':
    case L'A': formatFloat(result, directive, arguments); return true;
    case L's':
    case L'S': formatString(result, directive, arguments); return true;
    case L'c':
    case L'C': formatCharacter(result, directive, arguments); return true;
    case L'p': formatPointer(result, directive, arguments); return true;
    case L'n': storeCount(directive, result.size() - start, arguments); return true;
    case L'%': result += L'%'; return true;
    default: // An unknown conversion is text.
        result.append(L"%").append(begin, format);
        return true;
    }
}

} // namespace

bool formatText(std::wstring& result, const wchar_t* format, std::va_list& arguments) {
    const std::size_t start = result.size();
    while (*format) {
        if (*format != L'%')
            result += *format++;
        else if (!formatDirective(result, start, ++format, arguments))
            return false;
    }
    return true;
}

} // namespace Mz
