// SPDX-License-Identifier: BSL-1.0
/// Conversion of multibyte characters in the current C locale, the same on every system.
///
/// While LC_CTYPE is "C" or "POSIX", a byte and its character have the same value, from 0 to 255.
/// The C libraries differ in that, so they are not used for it. They convert in all other locales.
#pragma once

#include <cstddef>
#include <optional>
#include <string>
#include <string_view>

namespace Mz::platform {

/// The maximum number of bytes of one character.
inline constexpr std::size_t maximumCharacterBytes = 16;

/// Converts characters in the locale that the calling thread had when the converter was created.
/// That locale must not change while the converter is used.
class CharacterConverter {
  public:
    CharacterConverter();

    /// Converts as in the "C" locale if `plainBytes`, else in the locale of the calling thread,
    /// which then must not be "C" or "POSIX".
    explicit CharacterConverter(bool plainBytes) : plain(plainBytes) {}

    /// Decodes the first character of `bytes`.
    ///
    /// \param character  receives the character
    /// \return the number of bytes of the character; 0 for a NUL; -1 if the sequence is invalid,
    ///     incomplete or empty
    int decode(std::string_view bytes, wchar_t& character) const;

    /// Encodes `character`.
    ///
    /// \param bytes  receives the bytes of the character, without a terminator
    /// \return the number of bytes; -1 if the locale cannot represent the character
    int encode(wchar_t character, char (&bytes)[maximumCharacterBytes]) const;

    /// Returns whether each byte is the character of the same value.
    bool plainBytes() const { return plain; }

  private:
    bool plain;
};

/// Returns `text` as bytes; `std::nullopt` if the locale cannot represent one of the characters.
std::optional<std::string> toBytes(std::wstring_view text);

/// Returns `bytes` as characters; `std::nullopt` if they are invalid in the locale's encoding. A
/// NUL is a character.
std::optional<std::wstring> toCharacters(std::string_view bytes);

} // namespace Mz::platform
