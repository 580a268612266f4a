#include "components/objectIO/objectIO.h"

#include <cstdint>
#include <vector>

namespace Mz {

namespace {

constexpr const char* source = "components/objectIO/exactText";

/// Where `wchar_t` has 16 bits, two of them make up a character beyond those; on streams it is one
/// code, as it is where `wchar_t` has 32.
constexpr bool wideCharactersArePairs = sizeof(wchar_t) == 2;

bool isHighHalf(std::uint32_t code) {
    return code >= 0xD800 && code < 0xDC00;
}

bool isLowHalf(std::uint32_t code) {
    return code >= 0xDC00 && code < 0xE000;
}

std::vector<std::uint32_t> codesOf(const std::wstring& text) {
    std::vector<std::uint32_t> codes;
    codes.reserve(text.size());
    for (const wchar_t character : text) {
        const auto code = static_cast<std::uint32_t>(character);
        if (wideCharactersArePairs && !codes.empty() && isHighHalf(codes.back()) && isLowHalf(code))
            codes.back() = 0x10000 + ((codes.back() - 0xD800) << 10) + (code - 0xDC00);
        else
            codes.push_back(code);
    }
    return codes;
}

void append(std::wstring& text, std::uint32_t code) {
    if (!wideCharactersArePairs || code < 0x10000) {
        text += static_cast<wchar_t>(code);
        return;
    }
    if (code > 0x10FFFF)
        throw QrStreamEx::ExReadError(source, __LINE__, "a character that does not exist");
    text += static_cast<wchar_t>(0xD800 + ((code - 0x10000) >> 10));
    text += static_cast<wchar_t>(0xDC00 + ((code - 0x10000) & 0x3FF));
}

} // namespace

void QrWriteExactText(QrStream& stream, const std::wstring& text) {
    const std::vector<std::uint32_t> codes = codesOf(text);
    if (codes.size() > UINT32_MAX)
        throw QrStreamEx::ExWriteError(source, __LINE__, "the text is too long");
    stream << static_cast<std::uint32_t>(codes.size());
    for (const std::uint32_t code : codes)
        stream << code;
}

std::wstring QrReadExactText(QrStream& stream) {
    std::uint32_t count = 0;
    stream >> count;
    std::wstring text; // Grows with what arrives: the count is only a claim.
    for (; count > 0; --count) {
        std::uint32_t code = 0;
        stream >> code;
        append(text, code);
    }
    return text;
}

} // namespace Mz
