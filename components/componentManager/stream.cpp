// SPDX-License-Identifier: BSL-1.0
/// The text half of `QrStream`: every number goes through `formattedWrite` and `formattedRead`,
/// which derived classes may override. A separator is written late, before the next value, so that
/// data does not end in one. Numbers in the stream's own formats skip the general formatter. Where
/// no caller can tell the difference, their digits are made in the buffer of the standard stream,
/// also if an IO between the stream and that buffer passes numbers on (numberRelay.h).
#include "components/componentManager/stream.h"

#include "components/componentManager/buffers/byteSink.h"
#include "components/componentManager/buffers/byteSource.h"
#include "components/componentManager/buffers/numberPath.h"
#include "components/componentManager/support/alwaysInline.h"
#include "components/componentManager/text/characterCount.h"
#include "components/componentManager/text/formatText.h"
#include "components/componentManager/text/numberText.h"
#include "components/componentManager/text/numericLocale.h"
#include "components/componentManager/text/scanNumber.h"
#include "components/componentManager/text/scanText.h"
#include "components/componentManager/textStream.h"

#include <algorithm>
#include <cmath>
#include <cstdarg>
#include <cstddef>
#include <cstdint>
#include <limits>
#include <type_traits>
#include <typeinfo>

namespace Mz {

namespace {

constexpr const char* source = "components/componentManager/stream";

/// After a line longer than this, the next separator is a line end.
constexpr int longestLine = 70;

/// Scope of a list of arguments: calls `va_end` also after an exception.
class EndOfArguments {
  public:
    explicit EndOfArguments(std::va_list& arguments) : list(arguments) {}
    ~EndOfArguments() { va_end(list); }
    EndOfArguments(const EndOfArguments&) = delete;
    EndOfArguments& operator=(const EndOfArguments&) = delete;

  private:
    std::va_list& list;
};

/// Scope of a text kind. The outermost scope decides, because the operators call `formattedWrite`
/// and `formattedRead`.
class TextScope {
  public:
    using Kind = QrStream::TextKind;
    TextScope(Kind& current, Kind kind) : current(current), previous(current) {
        if (current == Kind::Other)
            current = kind;
    }
    ~TextScope() { current = previous; }
    TextScope(const TextScope&) = delete;
    TextScope& operator=(const TextScope&) = delete;

  private:
    Kind& current;
    const Kind previous;
};

/// Returns the text of a format that is not one of single numbers.
[[gnu::noinline]] std::wstring otherText(NumberText kind, const wchar_t* format,
                                         std::va_list& arguments) {
    std::wstring text;
    if (kind == NumberText::DoesNotFit || !formatText(text, format, arguments) ||
        text.size() > static_cast<std::size_t>(std::numeric_limits<int>::max()))
        throw QrStreamEx::ExWriteError(source, __LINE__);
    return text;
}

/// Returns the separator that is due, which it no longer is afterwards.
char takeSeparator(int& column, bool& pending) {
    const bool ends = column > longestLine;
    column = ends ? 0 : column + 1;
    pending = false;
    return ends ? '\n' : ' ';
}

/// Writes a number to `sink`, after the separator, which `note` receives. Returns false if the sink
/// is no standard buffer with room for it.
template <class T, class Note>
MZ_ALWAYS_INLINE inline bool placeNumber(const ByteSink& sink, T value, int& column,
                                         bool& separatorPending, const Note& note) {
    char* const place = sink.room(1 + longestNumberText);
    if (!place) [[unlikely]]
        return false;
    char* const digits = place + (separatorPending ? 1 : 0);
    char* const end = writeNumberText(digits, value);
    char separator = '\0';
    if (separatorPending)
        *place = separator = takeSeparator(column, separatorPending);
    note(separator);
    sink.advance(end - place);
    column = addCharacters(column, static_cast<int>(end - digits));
    separatorPending = true;
    return true;
}

} // namespace

QrStream::QrStream(QrCastable* io)
    : bufferedIO(QrPtr<QrBufferedIO>::adopt(safeCast<QrBufferedIO>(io))) {}

QrStream::~QrStream() = default;

bool QrStream::isTextStream() const {
    return false;
}

bool QrStream::isBinaryStream() const {
    return false;
}

int QrStream::computeLineNb() {
    const int64 position = io().tell();
    if (position < 0)
        return 1;
    io().seek(0, 0);
    int line = 1;
    wchar_t character;
    for (int64 read = 0; read < position && io().readChar(character) == 1; ++read)
        line = addCharacters(line, character == L'\n' ? 1 : 0);
    return line;
}

void QrStream::writeSeparator() {
    if (!separatorPending)
        return;
    if (column <= longestLine) {
        io().writeSpace();
        ++column;
    } else {
        io().writeEol();
        column = 0;
    }
    separatorPending = false;
}

void QrStream::skipSeparator() {
    if (!separatorPending)
        return;
    separatorPending = false;
    io().skipWhiteSpace(1);
}

void QrStream::endText() {
    if (!separatorPending)
        return;
    io().writeEol();
    column = 0;
    separatorPending = false;
}

int QrStream::formattedWrite(const wchar_t* format, ...) {
    std::va_list arguments;
    va_start(arguments, format);
    const EndOfArguments end(arguments);
    char number[1 + longestNumberText]; // The first place is for a separator.
    const ByteSink sink(io());
    // Made in its place: a copy of bytes that were just written has to wait for them.
    char* const place = sink.room(sizeof number);
    char* const begin = place ? place : number;
    char* const digits = begin + (!place || separatorPending ? 1 : 0);
    char* numberEnd = digits;
    const NumberText kind = formatNumber(numberEnd, format, arguments);
    if (kind != NumberText::Written) [[unlikely]] {
        const std::wstring text = otherText(kind, format, arguments);
        return writeText(text.data(), static_cast<int>(text.size()));
    }
    if (!place) [[unlikely]]
        return writeNumber(begin, numberEnd);
    if (separatorPending)
        *place = takeSeparator(column, separatorPending);
    sink.advance(numberEnd - place);
    const int length = static_cast<int>(numberEnd - digits);
    column = addCharacters(column, length);
    return length;
}

int QrStream::writeText(const wchar_t* text, int length) {
    const NumericLocale bracket(io());
    const TextScope scope(currentText, TextKind::Formatted);
    writeSeparator();
    column = addCharacters(column, io().writeChar(text, length));
    return length;
}

int QrStream::writeNumber(char* begin, const char* end) {
    const char* const digits = begin + 1;
    const int length = static_cast<int>(end - digits);
    // The words for infinities and NaNs, which end in a letter, are text for an IO that passes
    // numbers on.
    const bool isFinite = end[-1] <= '9';
    const NumberPath path(io());
    const bool mayPass = currentText == TextKind::Value && isFinite;
    const ByteSink sink(mayPass ? path.output() : io());
    if (!sink.isFree()) {
        wchar_t text[longestNumberText];
        return writeText(text, static_cast<int>(std::copy(digits, end, text) - text));
    }
    const bool hasSeparator = separatorPending;
    if (hasSeparator)
        *begin = takeSeparator(column, separatorPending);
    else
        ++begin;
    if (mayPass)
        path.noteNumber(hasSeparator ? *begin : '\0');
    sink.write(begin, static_cast<int>(end - begin));
    column = addCharacters(column, length);
    return length;
}

int QrStream::formattedRead(const wchar_t* format, ...) {
    std::va_list arguments;
    va_start(arguments, format);
    const EndOfArguments end(arguments);
    const TextScope scope(currentText, TextKind::Formatted);
    return scanText(io(), format, arguments);
}

template <class T>
QrStream& QrStream::writeFormatted(const wchar_t* format, T value, TextKind kind) {
    const TextScope scope(currentText, kind);
    formattedWrite(format, value);
    separatorPending = true;
    return *this;
}

/// Writes a number in place, also if an IO passes it on. The words for infinities and NaNs are text
/// for such an IO.
template <class T>
bool QrStream::writeInPlace(T value) {
    if (placeNumber(ByteSink(io()), value, column, separatorPending, [](char) {})) [[likely]]
        return true;
    if constexpr (std::is_floating_point_v<T>)
        if (!std::isfinite(value))
            return false;
    const TextScope scope(currentText, TextKind::Value);
    const NumberPath path(io());
    return placeNumber(ByteSink(path.output()), value, column, separatorPending,
                       [&](char separator) { path.noteNumber(separator); });
}

/// Only a derived class could observe that `formattedWrite` is not called.
template <class T>
QrStream& QrStream::writeTextOf(const wchar_t* format, T value) {
    if (&typeid(*this) == &typeid(QrTextStream) && writeInPlace(value)) [[likely]]
        return *this;
    return writeFormatted(format, value);
}

template <class T>
QrStream& QrStream::readFormatted(const wchar_t* format, T& value) {
    if (formattedRead(format, &value) != 1)
        throw QrStreamEx::ExReadError(source, __LINE__);
    return *this;
}

/// Reads a number from a standard buffer. Returns false if the buffer is another, or the number is
/// for the general scanner.
template <class T>
bool QrStream::readInPlace(T& value) {
    if (const ByteSource source(io()); source.isFree())
        return scanNumber(source, value) > 0;
    const TextScope scope(currentText, TextKind::Formatted);
    const NumberPath path(io());
    const ByteSource source(path.input());
    const int taken = source.isFree() ? scanNumber(source, value) : 0;
    if (taken > 0)
        path.noteRead(taken);
    return taken > 0;
}

/// Only a derived class could observe that `formattedRead` is not called.
template <class T>
QrStream& QrStream::readTextOf(const wchar_t* format, T& value) {
    if (&typeid(*this) == &typeid(QrTextStream) && readInPlace(value)) [[likely]]
        return *this;
    return readFormatted(format, value);
}

QrStream& QrStream::operator<<(unsigned long long value) {
    return writeTextOf(L"%I64u", value);
}

QrStream& QrStream::operator<<(int64 value) {
    return writeTextOf(L"%I64d", value);
}

QrStream& QrStream::operator<<(double value) {
    return writeTextOf(L"%.16g", value);
}

QrStream& QrStream::operator<<(float value) {
    return writeFormatted(L"%.9g", static_cast<double>(value));
}

QrStream& QrStream::operator<<(unsigned long value) {
    return writeFormatted(L"%lu", value);
}

QrStream& QrStream::operator<<(long value) {
    return writeFormatted(L"%ld", value);
}

QrStream& QrStream::operator<<(unsigned int value) {
    return writeTextOf(L"%u", value);
}

QrStream& QrStream::operator<<(int value) {
    return writeTextOf(L"%d", value);
}

QrStream& QrStream::operator<<(unsigned short value) {
    return writeFormatted(L"%u", static_cast<unsigned int>(value));
}

QrStream& QrStream::operator<<(short value) {
    return writeFormatted(L"%d", static_cast<int>(value));
}

QrStream& QrStream::operator<<(unsigned char value) {
    return writeFormatted(L"%u", static_cast<unsigned int>(value));
}

QrStream& QrStream::operator<<(wchar_t value) {
    const auto code = static_cast<std::uint32_t>(value);
    if (code > 0xFFFF)
        throw QrStreamEx::ExWriteError(source, __LINE__);
    return writeFormatted(L"%d", static_cast<int>(code), TextKind::Character);
}

QrStream& QrStream::operator<<(char value) {
    return writeFormatted(L"%d", static_cast<int>(static_cast<signed char>(value)));
}

QrStream& QrStream::operator<<(bool value) {
    const TextScope scope(currentText, TextKind::Value);
    writeSeparator();
    const wchar_t digit = value ? L'1' : L'0';
    column = addCharacters(column, io().writeChar(&digit, 1));
    return *this;
}

QrStream& QrStream::operator<<(const std::wstring& value) {
    if (value.size() > static_cast<std::size_t>(std::numeric_limits<int>::max()))
        throw QrStreamEx::ExWriteError(source, __LINE__);
    const int length = static_cast<int>(value.size());
    writeFormatted(L"%d", length);
    const TextScope scope(currentText, TextKind::String);
    writeSeparator();
    column = addCharacters(column, io().writeChar(value.data(), length));
    return *this;
}

QrStream& QrStream::operator>>(unsigned long long& value) {
    return readTextOf(L"%I64u", value);
}

QrStream& QrStream::operator>>(int64& value) {
    return readTextOf(L"%I64d", value);
}

QrStream& QrStream::operator>>(double& value) {
    return readTextOf(L"%lg", value);
}

QrStream& QrStream::operator>>(float& value) {
    return readTextOf(L"%g", value);
}

QrStream& QrStream::operator>>(unsigned long& value) {
    return readFormatted(L"%lu", value);
}

QrStream& QrStream::operator>>(long& value) {
    return readFormatted(L"%ld", value);
}

QrStream& QrStream::operator>>(unsigned int& value) {
    return readTextOf(L"%u", value);
}

QrStream& QrStream::operator>>(int& value) {
    return readTextOf(L"%d", value);
}

QrStream& QrStream::operator>>(unsigned short& value) {
    return readFormatted(L"%hu", value);
}

QrStream& QrStream::operator>>(short& value) {
    return readFormatted(L"%hd", value);
}

QrStream& QrStream::operator>>(unsigned char& value) {
    unsigned int number = 0;
    readFormatted(L"%u", number);
    value = static_cast<unsigned char>(number);
    return *this;
}

QrStream& QrStream::operator>>(wchar_t& value) {
    // A format without a conversion character assigns nothing: deliberately, the code of a
    // character cannot be read back.
    return readFormatted(L"%w", value);
}

QrStream& QrStream::operator>>(char& value) {
    int number = 0;
    readFormatted(L"%d", number);
    value = static_cast<char>(number);
    return *this;
}

QrStream& QrStream::operator>>(bool& value) {
    skipSeparator();
    const TextScope scope(currentText, TextKind::Value);
    wchar_t digit;
    if (io().readChar(&digit, 1, 1) == 0)
        throw QrStreamEx::ExReadError(source, __LINE__);
    value = digit != L'0';
    return *this;
}

QrStream& QrStream::operator>>(std::wstring& value) {
    int length = 0;
    *this >> length;
    skipSeparator();
    const TextScope scope(currentText, TextKind::String);
    if (!readCharacters(value, length))
        throw QrStreamEx::ExReadError(source, __LINE__);
    return *this;
}

bool QrStream::readCharacters(std::wstring& value, int length) {
    // The length is not trusted: memory grows with the characters that arrive.
    constexpr int chunk = 64 * 1024;
    constexpr int longestFill = 1024 * 1024;
    if (length < 0)
        return false;
    value.clear();
    int done = 0;
    do { // At least once: a foreign IO is called for an empty string too.
        const int wanted = std::min(chunk, length - done);
        value.resize(static_cast<std::size_t>(done) + static_cast<std::size_t>(wanted));
        wchar_t* arrived = value.data() + done;
        const int got = io().readChar(arrived, wanted, 0x7fffffff);
        if (got < wanted) {
            value.resize(static_cast<std::size_t>(done) +
                         static_cast<std::size_t>(std::max(got, 0)));
            return false;
        }
        done += wanted;
        // A NUL byte is never consumed and would fill any length, so a long run of them ends the
        // read.
        if (done > longestFill &&
            std::all_of(arrived, arrived + wanted, [](wchar_t c) { return c == L'\0'; }))
            return false;
    } while (done < length);
    return true;
}

} // namespace Mz
