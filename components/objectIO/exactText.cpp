// SPDX-License-Identifier: BSL-1.0
/// Exact text is a sequence of numbers, because numbers are the one thing that every kind of stream
/// carries exactly in every locale. The codes are those of whole characters: surrogate pairs are
/// joined when written and split when read where `wchar_t` has 16 bits, so files are portable.
#include "components/objectIO/objectIO.h"

#include "components/base/surrogates.h"

#include <cstdint>
#include <string>
#include <vector>

namespace Mz {

using namespace detail;

namespace {

constexpr const char* source = "components/objectIO/exactText";

std::vector<std::uint32_t> codesOf(const std::wstring& text) {
    std::vector<std::uint32_t> codes;
    codes.reserve(text.size());
    for (const wchar_t character : text) {
        const auto code = static_cast<std::uint32_t>(character);
        if (wideTextHasSurrogates && !codes.empty() && isHighSurrogate(codes.back()) &&
            isLowSurrogate(code))
            codes.back() = joinSurrogates(codes.back(), code);
        else
            codes.push_back(code);
    }
    return codes;
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
    std::wstring text; // Grows with the data that arrives, because the count is not trusted.
    for (; count > 0; --count) {
        std::uint32_t code = 0;
        stream >> code;
        if (wideTextHasSurrogates && code > lastCodePoint)
            throw QrStreamEx::ExReadError(source, __LINE__,
                                          "the code of a character is above 10FFFF");
        appendCodePoint(text, code);
    }
    return text;
}

} // namespace Mz
