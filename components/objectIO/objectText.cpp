#include "components/objectIO/objectText.h"

#include <algorithm>
#include <climits>
#include <cwchar>
#include <string>

namespace Mz {

namespace {

constexpr const char* source = "components/objectIO/objectText";
using TextKind = QrStream::TextKind;

[[noreturn]] void refuse(int line, const char* what) {
    throw QrStreamEx::ExWriteError(source, line, what);
}

/// Whether a text stream writes the character as part of a number that can be read back: those of
/// infinities and of what is no number are not.
bool isOfNumber(wchar_t c) {
    return c != L'\0' && std::wcschr(L"0123456789+-.e", c);
}

/// Whether the character, if the locale writes it at all, comes back. Some locales write one that
/// looks similar instead.
bool readsBack(wchar_t character) {
    char bytes[MB_LEN_MAX];
    std::mbstate_t writing{};
    const std::size_t length = std::wcrtomb(bytes, character, &writing);
    if (length == static_cast<std::size_t>(-1))
        return true; // It is refused where it is written.
    wchar_t again = L'\0';
    std::mbstate_t reading{};
    const std::size_t read = std::mbrtowc(&again, bytes, length, &reading);
    return read == (character == L'\0' ? 0 : length) && again == character;
}

wchar_t lowerCase(wchar_t c) {
    return c >= L'A' && c <= L'Z' ? static_cast<wchar_t>(c - L'A' + L'a') : c;
}

/// Whether a word of the text is what `%g` makes of a number that `%g` does not read.
bool hasInfiniteNumber(std::wstring_view text) {
    std::wstring word;
    const auto ends = [&] {
        const bool found = word == L"inf" || word == L"nan";
        word.clear();
        return found;
    };
    for (const wchar_t c : text) {
        const wchar_t lower = lowerCase(c);
        if ((lower >= L'a' && lower <= L'z') || (lower >= L'0' && lower <= L'9') || lower == L'_')
            word += lower;
        else if (ends())
            return true;
    }
    return ends();
}

/// White space is that of the scanner.
bool isSpace(wchar_t c) {
    return c == L' ' || (c >= L'\t' && c <= L'\r');
}

} // namespace

void ObjectTextOutput::check(TextKind kind, ObjectForm form, std::wstring_view text) {
    if (kind == TextKind::Character)
        refuse(__LINE__, "a single wchar_t, and an array of them in text, is written as a code and "
                         "never read back: write a number instead");
    if (kind == TextKind::String && !text.empty())
        refuse(__LINE__, "a string in text does not come back exactly: use QrWriteExactText");
    if (kind == TextKind::Value && form != ObjectForm::Binary) {
        if (!std::all_of(text.begin(), text.end(), isOfNumber))
            refuse(__LINE__, "text carries no infinite numbers, nor NaNs, exactly");
        return;
    }
    if (text.find(L'\0') != std::wstring_view::npos)
        refuse(__LINE__, "a string has a NUL in it");
    if (!std::all_of(text.begin(), text.end(), readsBack))
        refuse(__LINE__, "a string has a character that the locale does not know");
    if (kind == TextKind::Formatted && form != ObjectForm::Binary && hasInfiniteNumber(text))
        refuse(__LINE__, "formatted text has the word \"inf\" or \"nan\": an infinite number, or a "
                         "NaN, is not read back");
}

void ObjectTextOutput::begin(QrBufferedIO& io, TextKind kind, ObjectForm form,
                             std::wstring_view text) {
    const bool isFormatted = kind == TextKind::Formatted;
    if (isFormatted && text.empty())
        return;
    if (isFormatted && last == Last::Formatted && form != ObjectForm::Binary &&
        !isSpace(text.front()))
        refuse(__LINE__, "formatted text directly after formatted text, whose end could not be "
                         "found: write white space between them, or both by one format");
    const bool isByOperator = kind == TextKind::Value || kind == TextKind::String;
    if (last == Last::Formatted && isByOperator && form != ObjectForm::Binary)
        io.writeSpace();
    if (kind == TextKind::Other)
        last = Last::LineEndOrData;
    else if (!isFormatted)
        last = Last::Value;
    else
        last = isSpace(text.back()) ? Last::FormattedAndBlank : Last::Formatted;
}

void ObjectTextOutput::beginData(QrBufferedIO& io, ObjectForm form) {
    if (form == ObjectForm::Mixed && last == Last::FormattedAndBlank)
        refuse(__LINE__, "formatted text before binary data ends in white space, and the beginning "
                         "of the data could not be found: leave the white space out");
    if (form == ObjectForm::Mixed && last != Last::LineEndOrData)
        io.writeEol();
    last = Last::LineEndOrData;
}

void ObjectTextOutput::noteSpace() {
    last = Last::Value;
}

void ObjectTextOutput::noteLineEnd() {
    last = Last::LineEndOrData;
}

} // namespace Mz
