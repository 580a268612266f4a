/// Multibyte characters in the current C locale, the same on every system.
///
/// While LC_CTYPE is "C" or "POSIX", byte and character code are the same from 0 to 255. The C
/// libraries do not agree on that, so it is not left to them; every other locale is.
#pragma once

#include <cstddef>
#include <optional>
#include <string>
#include <string_view>

namespace Mz::platform {

/// No character has more bytes than this.
inline constexpr std::size_t maximumCharacterBytes = 16;

/// Converts characters by the locale that the calling thread had when the converter was made.
class CharacterConverter {
  public:
    CharacterConverter();

    /// Converts as in the "C" locale if `plainBytes`, else by the thread's locale, which then must
    /// be another one.
    explicit CharacterConverter(bool plainBytes) : plain(plainBytes) {}

    /// Reads the character at the beginning of `bytes` into `character` and returns how many bytes
    /// it takes: 0 for a NUL, -1 when the sequence is rejected, incomplete or empty.
    int decode(std::string_view bytes, wchar_t& character) const;

    /// Writes the bytes of `character` and returns how many, -1 when it has none in this locale.
    int encode(wchar_t character, char (&bytes)[maximumCharacterBytes]) const;

    /// Whether byte and character are one.
    bool plainBytes() const { return plain; }

  private:
    bool plain;
};

/// The whole of `text` in bytes; nothing when one character has no form.
std::optional<std::string> toBytes(std::wstring_view text);

/// The whole of `bytes` as characters, a NUL counting as one; nothing when they are no text.
std::optional<std::wstring> toCharacters(std::string_view bytes);

} // namespace Mz::platform
