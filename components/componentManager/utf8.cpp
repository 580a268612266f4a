// SPDX-License-Identifier: BSL-1.0
/// Converts UTF-8.
///
/// One decoder takes code points from bytes, and one encoder for each kind of text appends them.
/// Both work for 16-bit and 32-bit `wchar_t`. The decoder skips only one byte of an invalid
/// sequence, so that a valid sequence after it is not lost.
#include "components/componentManager/utf8.h"

#include "components/base/surrogates.h"

#include <cstddef>
#include <cstdint>

namespace Mz {

using namespace detail;

namespace {

void append(std::string& result, std::uint32_t code) {
    if (code > lastCodePoint || isHighSurrogate(code) || isLowSurrogate(code))
        code = 0xFFFD;
    const auto byte = [&](std::uint32_t value) { result += static_cast<char>(value); };
    const auto rest = [&](int shift) { byte(0x80 | (code >> shift & 0x3F)); };
    if (code < 0x80) {
        byte(code);
    } else if (code < 0x800) {
        byte(0xC0 | code >> 6);
        rest(0);
    } else if (code < 0x10000) {
        byte(0xE0 | code >> 12);
        rest(6);
        rest(0);
    } else {
        byte(0xF0 | code >> 18);
        rest(12);
        rest(6);
        rest(0);
    }
}

/// The result of `take` for a byte that begins no valid sequence.
constexpr std::uint32_t invalid = 0xFFFFFFFF;

/// Removes the first character from `bytes` and returns its code point. If the first byte begins no
/// valid sequence, removes that byte and returns `invalid`.
std::uint32_t take(std::string_view& bytes) {
    const auto byteAt = [&](std::size_t index) {
        return static_cast<std::uint32_t>(static_cast<unsigned char>(bytes[index]));
    };
    const std::uint32_t first = byteAt(0);
    const std::size_t length = first < 0x80   ? 1
                               : first < 0xC0 ? 0
                               : first < 0xE0 ? 2
                               : first < 0xF0 ? 3
                               : first < 0xF8 ? 4
                                              : 0;
    std::uint32_t code = length == 1 ? first : first & (0x7F >> length);
    for (std::size_t index = 1; index < length; ++index) {
        if (index >= bytes.size() || (byteAt(index) & 0xC0) != 0x80) {
            bytes.remove_prefix(1);
            return invalid;
        }
        code = code << 6 | (byteAt(index) & 0x3F);
    }
    // A sequence that is longer than necessary is invalid.
    constexpr std::uint32_t minimum[] = {0, 0, 0x80, 0x800, 0x10000};
    const bool valid = length > 0 && code >= minimum[length] && code <= lastCodePoint &&
                       !isHighSurrogate(code) && !isLowSurrogate(code);
    bytes.remove_prefix(valid ? length : 1);
    return valid ? code : invalid;
}

} // namespace

std::string toUtf8(std::wstring_view text) {
    std::string result;
    for (std::size_t index = 0; index < text.size(); ++index) {
        const auto unit = static_cast<std::uint32_t>(text[index]);
        if (isHighSurrogate(unit) && index + 1 < text.size() &&
            isLowSurrogate(static_cast<std::uint32_t>(text[index + 1]))) {
            append(result, joinSurrogates(unit, static_cast<std::uint32_t>(text[++index])));
        } else {
            append(result, unit);
        }
    }
    return result;
}

std::wstring fromUtf8(std::string_view bytes) {
    std::wstring result;
    while (!bytes.empty()) {
        const std::uint32_t code = take(bytes);
        appendCodePoint(result, code == invalid ? 0xFFFD : code);
    }
    return result;
}

std::string escapeInvalidUtf8(std::string_view bytes) {
    std::string result;
    while (!bytes.empty()) {
        const std::string_view before = bytes;
        if (take(bytes) == invalid) {
            constexpr const char* digits = "0123456789ABCDEF";
            const auto byte = static_cast<unsigned char>(before.front());
            result += "\\x";
            result += digits[byte >> 4];
            result += digits[byte & 15];
        } else {
            result += before.substr(0, before.size() - bytes.size());
        }
    }
    return result;
}

} // namespace Mz
