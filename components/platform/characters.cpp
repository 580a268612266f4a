// SPDX-License-Identifier: BSL-1.0
/// Converts characters one by one, each from the initial shift state.
///
/// The "C" locale is handled here, because the C libraries disagree about bytes above 127. The
/// restartable functions of the C library convert in all other locales.
#include "components/platform/characters.h"

#include "components/platform/platform.h"

#include <algorithm>
#include <climits>
#include <cstdint>
#include <cwchar>

namespace Mz::platform {

static_assert(maximumCharacterBytes >= MB_LEN_MAX);

CharacterConverter::CharacterConverter() : plain(usesPlainBytes()) {}

int CharacterConverter::decode(std::string_view bytes, wchar_t& character) const {
    if (bytes.empty())
        return -1;
    if (plain) {
        character = static_cast<unsigned char>(bytes.front());
        return character ? 1 : 0;
    }
    std::mbstate_t fresh{};
    const std::size_t length = std::mbrtowc(&character, bytes.data(), bytes.size(), &fresh);
    constexpr auto rejected = static_cast<std::size_t>(-1);
    constexpr auto incomplete = static_cast<std::size_t>(-2);
    return length == rejected || length == incomplete ? -1 : static_cast<int>(length);
}

int CharacterConverter::encode(wchar_t character, char (&bytes)[maximumCharacterBytes]) const {
    if (plain) {
        if (static_cast<std::uint32_t>(character) > 0xFF)
            return -1;
        bytes[0] = static_cast<char>(character);
        return 1;
    }
    std::mbstate_t fresh{};
    const std::size_t length = std::wcrtomb(bytes, character, &fresh);
    return length == static_cast<std::size_t>(-1) ? -1 : static_cast<int>(length);
}

std::optional<std::string> toBytes(std::wstring_view text) {
    const CharacterConverter converter;
    std::string result;
    result.reserve(text.size());
    for (const wchar_t character : text) {
        char bytes[maximumCharacterBytes];
        const int length = converter.encode(character, bytes);
        if (length < 0)
            return std::nullopt;
        result.append(bytes, static_cast<std::size_t>(length));
    }
    return result;
}

std::optional<std::wstring> toCharacters(std::string_view bytes) {
    const CharacterConverter converter;
    std::wstring result;
    if (converter.plainBytes()) {
        result.resize(bytes.size());
        std::transform(bytes.begin(), bytes.end(), result.begin(),
                       [](char byte) { return static_cast<unsigned char>(byte); });
        return result;
    }
    result.reserve(bytes.size());
    while (!bytes.empty()) {
        wchar_t character;
        const int length = converter.decode(bytes, character);
        if (length < 0)
            return std::nullopt;
        result.push_back(length ? character : L'\0');
        bytes.remove_prefix(length ? static_cast<std::size_t>(length) : 1);
    }
    return result;
}

} // namespace Mz::platform
