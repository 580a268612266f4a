// SPDX-License-Identifier: BSL-1.0
/// A scanner that reads character by character and never further than one lookahead character, so
/// that the next read continues exactly where this one stopped. The C library's scanner cannot do
/// that on a `QrBufferedIO`, and differs between platforms and locales. The scanner is a template
/// of its input: a free `ByteSource` supplies bytes directly, any other IO by its virtual
/// functions.
#include "components/componentManager/text/scanText.h"

#include "components/componentManager/bufferio.h"
#include "components/componentManager/buffers/byteSource.h"
#include "components/componentManager/buffers/numberPath.h"
#include "components/componentManager/text/characterCount.h"
#include "components/componentManager/text/numericLocale.h"
#include "components/componentManager/text/plainBytes.h"
#include "components/componentManager/text/scanNumber.h"

#include <algorithm>
#include <bitset>
#include <charconv>
#include <cstdint>
#include <limits>
#include <memory>
#include <system_error>

namespace Mz {

namespace {

/// White space is that of the "C" locale, whatever the locale of the process.
bool isSpace(wchar_t c) {
    return c == L' ' || (c >= L'\t' && c <= L'\r');
}

/// Returns the value of a digit, or 16 for any other character.
unsigned int digitValue(wchar_t c) {
    if (c >= L'0' && c <= L'9')
        return static_cast<unsigned int>(c - L'0');
    if (c >= L'a' && c <= L'f')
        return static_cast<unsigned int>(c - L'a') + 10;
    if (c >= L'A' && c <= L'F')
        return static_cast<unsigned int>(c - L'A') + 10;
    return 16;
}

/// The input by the virtual functions of an IO, with one lookahead character.
class LookaheadInput {
  public:
    explicit LookaheadInput(QrBufferedIO& source) : io(source) {}

    /// Returns whether there is a next character, which is then `next()`.
    bool available() {
        if (!held && !ended) {
            held = io.readChar(character) == 1;
            ended = !held;
        }
        return held;
    }
    wchar_t next() const { return character; }

    void consume() {
        held = false;
        consumed = addCharacters(consumed, 1);
    }

    /// Puts the lookahead character back, except a NUL, which was not consumed.
    void putBack() {
        if (held && character != L'\0')
            io.ungetc(character);
        held = false;
    }

    /// Returns the number of characters consumed, without the lookahead; at most the largest `int`.
    int consumedCharacters() const { return consumed; }

  private:
    QrBufferedIO& io;
    wchar_t character = 0;
    bool held = false;
    bool ended = false;
    int consumed = 0;
};

/// The input from a free source, where bytes are characters. The lookahead stays in the buffer, so
/// nothing needs to be put back.
class DirectInput {
  public:
    explicit DirectInput(const ByteSource& bytes) : source(bytes) {}

    bool available() {
        if (byte == unknown)
            byte = source.peek();
        return byte >= 0;
    }
    wchar_t next() const { return static_cast<wchar_t>(byte); }

    /// Does not look at the next character yet: an interactive input could block.
    void consume() {
        source.take(1);
        byte = unknown;
        consumed = addCharacters(consumed, 1);
    }

    void putBack() {}

    int consumedCharacters() const { return consumed; }

  private:
    static constexpr int unknown = -2;

    ByteSource source;
    int byte = unknown;
    int consumed = 0;
};

struct Directive {
    bool assigns = true;
    bool isLong = false;  ///< `l` or `L`
    bool isShort = false; ///< `h`
    bool isWide = false;  ///< `w`
    bool is64 = false;    ///< `I64`
    int width = 0;        ///< 0 for none
    wchar_t conversion = 0;
};

/// Reads modifiers and width, in any order, and moves `format` to the conversion character. A
/// repeated modifier counts once.
Directive parseDirective(const wchar_t*& format) {
    Directive directive;
    for (;; ++format) {
        const wchar_t c = *format;
        if (c == L'*')
            directive.assigns = false;
        else if (c >= L'0' && c <= L'9')
            directive.width = directive.width < std::numeric_limits<int>::max() / 16
                                  ? directive.width * 10 + (c - L'0')
                                  : directive.width;
        else if (c == L'I' && format[1] == L'6' && format[2] == L'4')
            directive.is64 = true, format += 2;
        else if (c == L'l' || c == L'L')
            directive.isLong = true;
        else if (c == L'h')
            directive.isShort = true;
        else if (c == L'w')
            directive.isWide = true;
        else if (c != L'F' && c != L'N')
            break;
    }
    directive.conversion = *format;
    return directive;
}

/// The set of characters that a `[` accepts. Characters have 16 bits on every platform.
class CharacterSet {
  public:
    /// Reads the set at `format`, after the '[', and moves `format` to its ']' or the end of the
    /// format.
    explicit CharacterSet(const wchar_t*& format) : members(std::make_unique<Members>()) {
        if (*format == L'^') {
            negated = true;
            ++format;
        }
        bool first = true;
        for (; *format && (first || *format != L']'); ++format, first = false) {
            const bool isRange = format[1] == L'-' && format[2] && format[2] != L']';
            addRange(format[0], isRange ? format[2] : format[0]);
            if (isRange)
                format += 2;
        }
    }

    bool contains(wchar_t c) const {
        const auto code = static_cast<std::uint32_t>(c);
        return code <= largest && members->test(code) != negated;
    }

  private:
    static constexpr std::uint32_t largest = 0xFFFF;
    using Members = std::bitset<largest + 1>;

    void addRange(wchar_t from, wchar_t to) {
        const auto a = static_cast<std::uint32_t>(from);
        const auto b = static_cast<std::uint32_t>(to);
        for (std::uint32_t code = std::min(a, b); code <= std::min(std::max(a, b), largest); ++code)
            members->set(code);
    }

    std::unique_ptr<Members> members;
    bool negated = false;
};

/// Whether a number outside the range of `double` is too small and not too large.
bool isBelowOne(const char* begin, const char* end) {
    int64 magnitude = 0; // The decimal exponent of the first digit that is not zero.
    bool point = false;
    bool significant = false;
    const char* at = begin;
    for (; at != end && *at != 'e' && *at != 'E'; ++at) {
        if (*at == '.') {
            point = true;
            continue;
        }
        significant = significant || *at != '0';
        if (significant && !point)
            ++magnitude;
        else if (!significant && point)
            --magnitude;
    }
    int64 exponent = 0;
    bool negative = false;
    for (; at != end; ++at) {
        negative = negative || *at == '-';
        if (*at >= '0' && *at <= '9' && exponent < 1'000'000'000)
            exponent = exponent * 10 + (*at - '0');
    }
    return magnitude + (negative ? -exponent : exponent) <= 0;
}

/// Converts the longest prefix that is a number, as the C library does in the "C" locale: infinity
/// if it is too large, zero if it is too small.
double doubleOf(const char* begin, const char* end) {
    const bool negative = *begin == '-';
    if (negative || *begin == '+')
        ++begin;
    double value = 0;
    if (std::from_chars(begin, end, value).ec == std::errc::result_out_of_range)
        value = isBelowOne(begin, end) ? 0.0 : std::numeric_limits<double>::infinity();
    return negative ? -value : value;
}

template <class Input>
class Scanner {
  public:
    Scanner(const Input& source, std::va_list& argumentList)
        : input(source), arguments(argumentList) {}

    int scan(const wchar_t* format) {
        while (*format && step(format)) {
        }
        input.putBack();
        return assigned;
    }

  private:
    /// Processes one element of the format and moves `format` to its end. Returns false at the end
    /// of the scan.
    bool step(const wchar_t*& format) {
        if (isSpace(*format)) {
            while (isSpace(*format))
                ++format;
            skipSpace();
            return true;
        }
        if (*format != L'%')
            return matches(*format++);
        ++format;
        const Directive directive = parseDirective(format);
        if (!directive.conversion)
            return endsUnfinished();
        ++format;
        return follow(directive, format);
    }

    void skipSpace() {
        while (input.available() && isSpace(input.next()))
            input.consume();
    }

    bool matches(wchar_t wanted) {
        if (!input.available() || input.next() != wanted)
            return false;
        input.consume();
        return true;
    }

    /// Handles a directive without a conversion character. It compares the next character after
    /// white space with the terminator of the format, which never matches.
    bool endsUnfinished() {
        skipSpace();
        return false;
    }

    bool follow(const Directive& directive, const wchar_t*& format) {
        switch (directive.conversion) {
        case L'c':
        case L'C': return readText(directive, 'c', nullptr);
        case L'[': {
            const CharacterSet set(format);
            if (*format)
                ++format;
            return readText(directive, '[', &set);
        }
        case L'n': return storeConsumed(directive);
        default: break;
        }
        skipSpace();
        switch (directive.conversion) {
        case L'd':
        case L'D':
        case L'u':
        case L'U': return readInteger(directive, 10);
        case L'o':
        case L'O': return readInteger(directive, 8);
        case L'x':
        case L'X':
        case L'p':
        case L'P': return readInteger(directive, 16);
        case L'i':
        case L'I': return readInteger(directive, 10);
        case L'e':
        case L'E':
        case L'f':
        case L'g':
        case L'G': return readFloat(directive);
        case L's':
        case L'S': return readText(directive, 's', nullptr);
        default: return matches(directive.conversion);
        }
    }

    /// The number of characters that a conversion may still take.
    class Budget {
      public:
        explicit Budget(int width) : left(width > 0 ? width : std::numeric_limits<int>::max()) {}
        bool any() const { return left > 0; }
        void take() { --left; }

      private:
        int left;
    };

    void take(Budget& budget) {
        input.consume();
        budget.take();
    }

    bool nextIs(const Budget& budget, wchar_t a, wchar_t b) {
        return budget.any() && input.available() && (input.next() == a || input.next() == b);
    }

    bool readInteger(const Directive& directive, unsigned int base) {
        Budget budget(directive.width);
        const bool signedText = nextIs(budget, L'+', L'-');
        const bool negative = signedText && input.next() == L'-';
        if (signedText)
            take(budget);
        bool anyDigit = false;
        readPrefix(directive, budget, base, anyDigit);
        std::uint64_t value = 0;
        for (; budget.any() && input.available(); take(budget)) {
            const unsigned int digit = digitValue(input.next());
            if (digit >= base)
                break;
            value = value * base + digit;
            anyDigit = true;
        }
        if (!anyDigit)
            return false;
        storeInteger(directive, negative ? 0 - value : value);
        return true;
    }

    /// Reads the "0x" of `x` and `i`, or the leading "0" that makes the number of `i` octal. A zero
    /// without an "x" after it is a digit of the number.
    void readPrefix(const Directive& directive, Budget& budget, unsigned int& base,
                    bool& anyDigit) {
        const bool detects = directive.conversion == L'i' || directive.conversion == L'I';
        const bool hexadecimal = directive.conversion == L'x' || directive.conversion == L'X';
        if ((!detects && !hexadecimal) || !nextIs(budget, L'0', L'0'))
            return;
        take(budget);
        if (nextIs(budget, L'x', L'X')) {
            take(budget);
            base = 16;
            return;
        }
        anyDigit = true;
        if (detects)
            base = 8;
    }

    void storeInteger(const Directive& directive, std::uint64_t value) {
        if (!directive.assigns)
            return;
        const auto low = static_cast<std::uint32_t>(value);
        if (directive.is64) {
            *va_arg(arguments, std::uint64_t*) = value;
        } else if (directive.isShort) {
            *va_arg(arguments, std::uint16_t*) = static_cast<std::uint16_t>(value);
        } else if (directive.isLong) {
            // A `long` has 32 bits in the text, whatever its width on this platform.
            const bool isSigned = directive.conversion == L'd' || directive.conversion == L'D' ||
                                  directive.conversion == L'i' || directive.conversion == L'I';
            const long wide = isSigned ? static_cast<long>(static_cast<std::int32_t>(low))
                                       : static_cast<long>(low);
            *va_arg(arguments, long*) = wide;
        } else {
            *va_arg(arguments, std::uint32_t*) = low;
        }
        ++assigned;
    }

    bool storeConsumed(const Directive& directive) {
        if (directive.assigns) {
            const int before = assigned;
            storeInteger(directive, static_cast<std::uint64_t>(input.consumedCharacters()));
            assigned = before;
        }
        return true;
    }

    /// The characters of a floating-point number. The length is a fixed limit of the formats.
    struct FloatText {
        static constexpr int longest = 349;
        char characters[longest];
        int length = 0;

        void append(wchar_t c) { characters[length++] = static_cast<char>(c); }
        const char* begin() const { return characters; }
        const char* end() const { return characters + length; }
    };

    void takeDigits(Budget& budget, FloatText& text, bool& any) {
        for (; budget.any() && input.available() && digitValue(input.next()) < 10; take(budget)) {
            text.append(input.next());
            any = true;
        }
    }

    bool takeOneOf(Budget& budget, FloatText& text, wchar_t a, wchar_t b) {
        if (!nextIs(budget, a, b))
            return false;
        text.append(input.next());
        take(budget);
        return true;
    }

    bool readFloat(const Directive& directive) {
        constexpr int longest = FloatText::longest;
        Budget budget(directive.width > 0 && directive.width < longest ? directive.width : longest);
        FloatText text;
        bool anyDigit = false;
        takeOneOf(budget, text, L'+', L'-');
        takeDigits(budget, text, anyDigit);
        if (takeOneOf(budget, text, L'.', L'.'))
            takeDigits(budget, text, anyDigit);
        if (!anyDigit)
            return false;
        if (takeOneOf(budget, text, L'e', L'E')) {
            takeOneOf(budget, text, L'+', L'-');
            bool ignored = false;
            takeDigits(budget, text, ignored);
        }
        if (directive.assigns)
            storeFloat(directive, doubleOf(text.begin(), text.end()));
        return true;
    }

    void storeFloat(const Directive& directive, double value) {
        if (directive.isLong)
            *va_arg(arguments, double*) = value;
        else
            *va_arg(arguments, float*) = static_cast<float>(value);
        ++assigned;
    }

    static bool storesWide(const Directive& directive) {
        if (directive.isShort)
            return false;
        if (directive.isLong || directive.isWide)
            return true;
        return directive.conversion != L'C' && directive.conversion != L'S';
    }

    /// The argument that receives the characters, wide or narrow.
    class Target {
      public:
        Target(bool assigns, bool isWide, std::va_list& argumentList) {
            if (assigns && isWide)
                wide = va_arg(argumentList, wchar_t*);
            else if (assigns)
                narrow = va_arg(argumentList, char*);
        }

        /// Returns false if the character has no narrow form.
        bool store(wchar_t c) {
            if (wide)
                *wide++ = c;
            if (!narrow)
                return true;
            char bytes[platform::maximumCharacterBytes];
            const int length = converter.encode(c, bytes);
            for (int index = 0; index < length; ++index)
                *narrow++ = bytes[index];
            return length >= 0;
        }

        void terminate() {
            if (wide)
                *wide = L'\0';
            if (narrow)
                *narrow = '\0';
        }

      private:
        wchar_t* wide = nullptr;
        char* narrow = nullptr;
        const PlainBytes asInC;
        const platform::CharacterConverter converter = bufferedConverter();
    };

    /// Reads the characters that `c`, `s` or `[` accepts. A NUL, which is never consumed, ends each
    /// of them.
    bool readText(const Directive& directive, char kind, const CharacterSet* set) {
        Budget budget(kind == 'c' && directive.width == 0 ? 1 : directive.width);
        Target target(directive.assigns, storesWide(directive), arguments);
        bool any = false;
        for (; budget.any() && input.available() && input.next() != L'\0'; take(budget)) {
            const wchar_t c = input.next();
            if ((kind == 's' && isSpace(c)) || (set && !set->contains(c)))
                break;
            if (!target.store(c))
                return false;
            any = true;
        }
        if (!any)
            return false;
        if (kind != 'c')
            target.terminate();
        assigned += directive.assigns ? 1 : 0;
        return true;
    }

    Input input;
    std::va_list& arguments;
    int assigned = 0;
};

} // namespace

int scanText(QrBufferedIO& io, const wchar_t* format, std::va_list& arguments) {
    if (!*format)
        return 0;
    if (const ByteSource source(io); source.isFree()) {
        if (scanNumber(source, format, arguments) > 0)
            return 1;
        return Scanner(DirectInput(source), arguments).scan(format);
    }
    const NumberPath path(io);
    if (const ByteSource source(path.input()); source.isFree())
        if (const int taken = scanNumber(source, format, arguments); taken > 0) {
            path.noteRead(taken);
            return 1;
        }
    const NumericLocale bracket(io);
    return Scanner(LookaheadInput(io), arguments).scan(format);
}

} // namespace Mz
