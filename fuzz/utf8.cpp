// SPDX-License-Identifier: BSL-1.0
// Converts any bytes from UTF-8 and to it. The standard library's reader of UTF-8 checks ours.
#include "components/componentManager/utf8.h"

#include "fuzz/fuzz.h"

#include <locale>

namespace {

using namespace Mz;

/// What the standard library's conversion reads at the beginning of `bytes`.
struct Sequence {
    std::size_t length = 0; ///< 0 if no valid sequence begins there
    char32_t code = 0xFFFD;
};

Sequence sequenceAt(std::string_view bytes) {
    using Facet = std::codecvt<char32_t, char8_t, std::mbstate_t>;
    static const Facet& facet = std::use_facet<Facet>(std::locale::classic());
    const auto* const begin = reinterpret_cast<const char8_t*>(bytes.data());
    std::mbstate_t state{};
    const char8_t* next = begin;
    Sequence result;
    char32_t code = 0;
    char32_t* end = &code;
    facet.in(state, begin, begin + bytes.size(), next, &code, &code + 1, end);
    // The library of GCC 12 takes halves of pairs, which are no characters.
    if (end == &code + 1 && (code < 0xD800 || code > 0xDFFF))
        result = {static_cast<std::size_t>(next - begin), code};
    return result;
}

/// Returns the elements of a character on this platform.
std::wstring elementsOf(char32_t code) {
    if (sizeof(wchar_t) > 2 || code < 0x10000)
        return {static_cast<wchar_t>(code)};
    return {static_cast<wchar_t>(0xD800 + ((code - 0x10000) >> 10)),
            static_cast<wchar_t>(0xDC00 + ((code - 0x10000) & 0x3FF))};
}

void expectAsTheStandardReads(std::string_view bytes) {
    std::wstring text;
    std::string escaped;
    for (std::size_t at = 0; at < bytes.size();) {
        const Sequence sequence = sequenceAt(bytes.substr(at));
        text += elementsOf(sequence.code);
        if (sequence.length) {
            escaped += bytes.substr(at, sequence.length);
        } else {
            char form[5];
            std::snprintf(form, sizeof form, "\\x%02X", static_cast<unsigned char>(bytes[at]));
            escaped += form;
        }
        at += sequence.length ? sequence.length : 1;
    }
    Fuzz::expect(fromUtf8(bytes) == text, "wide text is what the standard library reads");
    Fuzz::expectSame(escapeInvalidUtf8(bytes), escaped, "what is invalid is escaped");
    const bool valid = escaped == bytes;
    Fuzz::expect(!valid || toUtf8(text) == bytes, "valid text comes back");
}

/// Any elements become valid UTF-8, which comes back as it is.
void expectValid(std::wstring_view elements) {
    const std::string bytes = toUtf8(elements);
    Fuzz::expectSame(escapeInvalidUtf8(bytes), bytes, "what is written is valid");
    Fuzz::expectSame(toUtf8(fromUtf8(bytes)), bytes, "what is written comes back");
}

} // namespace

int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    const std::string_view bytes = Fuzz::Input(data, size).rest();
    expectAsTheStandardReads(bytes);
    std::wstring elements(size / sizeof(wchar_t), L'\0');
    if (!elements.empty())
        std::memcpy(elements.data(), bytes.data(), elements.size() * sizeof(wchar_t));
    expectValid(elements);
    // Small elements are rare in random bytes: two bytes each.
    std::wstring small;
    for (Fuzz::Input input(data, size); small.size() < size / 2;) {
        const unsigned int high = input.byte();
        small += static_cast<wchar_t>(high << 8 | input.byte());
    }
    expectValid(small);
    return 0;
}
