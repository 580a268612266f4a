// SPDX-License-Identifier: BSL-1.0
/// Uids written as text. A malformed text does not compile.
///
///     using namespace Mz::literals;
///     constexpr Mz::QrUid gaugeUid = "6E1B0A01-4D1F-11EF-9C2A-7B105D3E8F41"_uid;
///
/// \since 0.2
#pragma once

#include "components/componentManager/uid.h"

#include <cstddef>
#include <cstdint>
#include <string_view>

namespace Mz {

namespace detail {

/// Returns the value of a hexadecimal digit. Evaluated by the compiler only, so that the exception
/// is an error message.
consteval std::uint32_t digitOfUid(char digit) {
    if (digit >= '0' && digit <= '9')
        return static_cast<std::uint32_t>(digit - '0');
    if (digit >= 'A' && digit <= 'F')
        return static_cast<std::uint32_t>(digit - 'A' + 10);
    if (digit >= 'a' && digit <= 'f')
        return static_cast<std::uint32_t>(digit - 'a' + 10);
    throw "this uid has a character that is no hexadecimal digit: use 0-9 and A-F";
}

/// Returns the uid that `text` consists of. See `operator""_uid`.
consteval QrUid parseUid(std::string_view text) {
    constexpr std::size_t shortGroups[] = {8, 13, 18, 23}; // XXXXXXXX-XXXX-XXXX-XXXX-XXXXXXXXXXXX
    constexpr std::size_t words[] = {8, 17, 26};           // XXXXXXXX-XXXXXXXX-XXXXXXXX-XXXXXXXX
    const auto isHyphen = [&](const auto& positions, std::size_t index) {
        for (const std::size_t position : positions)
            if (position == index)
                return true;
        return false;
    };
    if (text.size() != 36 && text.size() != 35)
        throw "this uid has a wrong length: write 32 digits as "
              "XXXXXXXX-XXXX-XXXX-XXXX-XXXXXXXXXXXX";
    std::uint32_t parsed[4] = {};
    std::size_t digits = 0;
    for (std::size_t index = 0; index < text.size(); ++index) {
        const bool hyphen =
            text.size() == 36 ? isHyphen(shortGroups, index) : isHyphen(words, index);
        if (hyphen != (text[index] == '-'))
            throw "this uid has a misplaced hyphen: write XXXXXXXX-XXXX-XXXX-XXXX-XXXXXXXXXXXX";
        if (hyphen)
            continue;
        std::uint32_t& word = parsed[digits++ / 8];
        word = word * 16 + digitOfUid(text[index]);
    }
    return {parsed[0], parsed[1], parsed[2], parsed[3]};
}

} // namespace detail

inline namespace literals {

/// Returns the uid whose 32 hexadecimal digits are, in order, its four words.
///
/// The digits are grouped as in `"6E1B0A01-4D1F-11EF-9C2A-7B105D3E8F41"`, the usual form of a
/// 128-bit identity, or in words, as in `"6E1B0A01-4D1F11EF-9C2A7B10-5D3E8F41"`, the form that
/// `mzcomponents explain` prints. Letters may be lower case. Every other text is an error of the
/// compiler.
consteval QrUid operator""_uid(const char* text, std::size_t length) {
    return detail::parseUid({text, length});
}

} // namespace literals

} // namespace Mz
