// SPDX-License-Identifier: BSL-1.0
/// Converts between wide text, bytes and file names.
///
/// File names are bytes on one system and wide text on the other. Overloads handle both forms, and
/// the type of `std::filesystem::path::native()` selects one, so that no condition here depends on
/// the system. Characters are converted by `platform::CharacterConverter`.
#include "components/componentManager/nativeText.h"

#include "components/componentManager/utf8.h"
#include "components/platform/characters.h"
#include "components/platform/platform.h"

#include <cstddef>
#include <type_traits>

namespace Mz {

namespace {

constexpr bool namesAreBytes = std::is_same_v<std::filesystem::path::value_type, char>;

[[maybe_unused]] std::optional<std::wstring> widen(std::string_view name) {
    return platform::toCharacters(name);
}

[[maybe_unused]] std::optional<std::wstring> widen(std::wstring_view name) {
    return std::wstring(name);
}

std::wstring forDisplay(std::string_view name) {
    const platform::CharacterConverter converter;
    std::wstring result;
    while (!name.empty()) {
        wchar_t character;
        const int length = converter.decode(name, character);
        if (length > 0) {
            result += character;
        } else {
            constexpr const wchar_t* digits = L"0123456789ABCDEF";
            const auto byte = static_cast<unsigned char>(name.front());
            result += L"\\x";
            result += digits[byte >> 4];
            result += digits[byte & 15];
        }
        name.remove_prefix(length > 0 ? static_cast<std::size_t>(length) : 1);
    }
    return result;
}

[[maybe_unused]] std::wstring forDisplay(std::wstring_view name) {
    return std::wstring(name);
}

bool namesArePlainBytes() {
    return namesAreBytes && platform::CharacterConverter().plainBytes();
}

[[maybe_unused]] std::string nameInUtf8(std::string_view name) {
    return namesArePlainBytes() ? escapeInvalidUtf8(name) : toUtf8(forDisplay(name));
}

[[maybe_unused]] std::string nameInUtf8(std::wstring_view name) {
    return toUtf8(name);
}

} // namespace

std::optional<std::wstring> toWide(std::string_view bytes) {
    return platform::toCharacters(bytes);
}

std::optional<std::string> toNarrow(std::wstring_view text) {
    return platform::toBytes(text);
}

std::string toNarrow(std::wstring_view text, char substitute) {
    const platform::CharacterConverter converter;
    std::string result;
    for (const wchar_t character : text) {
        char bytes[platform::maximumCharacterBytes];
        const int length = converter.encode(character, bytes);
        if (length > 0)
            result.append(bytes, static_cast<std::size_t>(length));
        else
            result += substitute;
    }
    return result;
}

std::optional<std::wstring> toWideName(const std::filesystem::path& path) {
    return widen(path.native());
}

std::optional<std::filesystem::path> toNativePath(std::wstring_view name) {
    const std::optional<platform::NativePath> native = platform::toNative(name);
    if (!native)
        return std::nullopt;
    return std::filesystem::path(*native);
}

std::wstring displayName(const std::filesystem::path& path) {
    return forDisplay(path.native());
}

std::string utf8Name(const std::filesystem::path& path) {
    return nameInUtf8(path.native());
}

std::wstring displayText(std::string_view utf8) {
    return namesArePlainBytes() ? forDisplay(utf8) : fromUtf8(utf8);
}

} // namespace Mz
