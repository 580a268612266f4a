// SPDX-License-Identifier: BSL-1.0
/// UTF-16 surrogates: pairs of 16-bit units that encode one character above U+FFFF. On Windows
/// `wchar_t` is such a unit; on Linux it is a whole character, but text from elsewhere may still
/// contain pairs.
///
/// For the libraries of this project. Applications use `toUtf8` and `fromUtf8` (`utf8.h`).
#pragma once

#include <cstdint>
#include <string>

namespace Mz::detail {

/// Whether wide text contains a character above U+FFFF as a pair.
inline constexpr bool wideTextHasSurrogates = sizeof(wchar_t) == 2;

/// The largest code point.
inline constexpr std::uint32_t lastCodePoint = 0x10FFFF;

/// Returns whether `unit` is the first half of a pair.
constexpr bool isHighSurrogate(std::uint32_t unit) {
    return unit >= 0xD800 && unit < 0xDC00;
}

/// Returns whether `unit` is the second half of a pair.
constexpr bool isLowSurrogate(std::uint32_t unit) {
    return unit >= 0xDC00 && unit < 0xE000;
}

/// Returns the code point of a pair. Requires that `high` and `low` are its two halves.
constexpr std::uint32_t joinSurrogates(std::uint32_t high, std::uint32_t low) {
    return 0x10000 + ((high - 0xD800) << 10) + (low - 0xDC00);
}

/// Returns the first half of the pair for `code`, which is above U+FFFF. The result is a surrogate
/// even if `code` is above `lastCodePoint`.
constexpr char16_t highSurrogate(std::uint32_t code) {
    return static_cast<char16_t>(0xD800 + ((code - 0x10000) >> 10 & 0x3FF));
}

/// Returns the second half of the pair for `code`, which is above U+FFFF.
constexpr char16_t lowSurrogate(std::uint32_t code) {
    return static_cast<char16_t>(0xDC00 + (code & 0x3FF));
}

/// Appends `code` to wide text, as a pair where `wchar_t` has 16 bits and the code point needs one.
inline void appendCodePoint(std::wstring& text, std::uint32_t code) {
    if (wideTextHasSurrogates && code > 0xFFFF) {
        text += static_cast<wchar_t>(highSurrogate(code));
        text += static_cast<wchar_t>(lowSurrogate(code));
    } else {
        text += static_cast<wchar_t>(code);
    }
}

} // namespace Mz::detail
