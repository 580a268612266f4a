// SPDX-License-Identifier: BSL-1.0
/// Decides from the kind of each piece of text (`QrStream::textKind`) whether it can be read back
/// and which separator it needs. All that it keeps of earlier output is how the last piece ended.
/// It throws when the object is written, because the data is lost by the time it is read.
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

/// Whether the character belongs to a number that can be read back. The letters of "inf" and "nan"
/// do not.
bool isOfNumber(wchar_t c) {
    return (c >= L'0' && c <= L'9') || c == L'+' || c == L'-' || c == L'.' || c == L'e';
}

/// Whether the character is the same single byte in every locale. Some locales have another
/// character in the place of a backslash, a tilde or a currency sign.
bool isPortable(wchar_t c) {
    return (c >= L'a' && c <= L'z') || (c >= L'A' && c <= L'Z') || (c >= L' ' && c <= L'"') ||
           (c >= L'%' && c <= L'?') || c == L'_' || (c >= L'\t' && c <= L'\r');
}

/// Whether the character is read back, if the locale writes it at all. Some locales write a similar
/// one in its place.
bool readsBack(wchar_t character) {
    if (isPortable(character))
        return true;
    char bytes[MB_LEN_MAX];
    std::mbstate_t writing{};
    const std::size_t length = std::wcrtomb(bytes, character, &writing);
    if (length == static_cast<std::size_t>(-1))
        return true; // The IO throws when it writes the character.
    wchar_t again = L'\0';
    std::mbstate_t reading{};
    const std::size_t read = std::mbrtowc(&again, bytes, length, &reading);
    return read == (character == L'\0' ? 0 : length) && again == character;
}

wchar_t lowerCase(wchar_t c) {
    return c >= L'A' && c <= L'Z' ? static_cast<wchar_t>(c - L'A' + L'a') : c;
}

/// Whether a word of the text is one that `%g` writes for a number and does not read.
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

/// White space as the scanner of formatted text defines it.
bool isSpace(wchar_t c) {
    return c == L' ' || (c >= L'\t' && c <= L'\r');
}

} // namespace

void ObjectTextOutput::check(TextKind kind, ObjectForm form, std::wstring_view text) {
    if (kind == TextKind::Character)
        refuse(__LINE__, "a single wchar_t, and an array of them in text, is written as a code and "
                         "never read back: write a number instead");
    if (kind == TextKind::String && !text.empty())
        refuse(__LINE__, "text cannot carry a string exactly: use QrWriteExactText");
    if (kind == TextKind::Value && form != ObjectForm::Binary) {
        if (!std::all_of(text.begin(), text.end(), isOfNumber))
            refuse(__LINE__, "text cannot carry an infinity or a NaN exactly");
        return;
    }
    if (text.find(L'\0') != std::wstring_view::npos)
        refuse(__LINE__, "a string has a NUL in it");
    if (!std::all_of(text.begin(), text.end(), readsBack))
        refuse(__LINE__, "a string has a character that the locale lacks");
    if (kind == TextKind::Formatted && form != ObjectForm::Binary && hasInfiniteNumber(text))
        refuse(__LINE__, "formatted text has the word \"inf\" or \"nan\": an infinity or a NaN "
                         "cannot be read back");
}

void ObjectTextOutput::begin(QrBufferedIO& io, TextKind kind, ObjectForm form,
                             std::wstring_view text) {
    const bool isFormatted = kind == TextKind::Formatted;
    if (isFormatted && text.empty())
        return;
    if (isFormatted && last == Last::Formatted && form != ObjectForm::Binary &&
        !isSpace(text.front()))
        refuse(__LINE__, "formatted text directly after formatted text, whose end a reader could "
                         "not find: write white space between them, or use one format");
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
        refuse(__LINE__, "formatted text before binary data ends in white space, so a reader could "
                         "not find the beginning of the data: omit the white space");
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
