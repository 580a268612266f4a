// SPDX-License-Identifier: BSL-1.0
/// The input buffer fetches single bytes, converts them, and puts back those that it did not need,
/// so that the position is exact after each operation. It keeps no data: all state is the stream's.
/// Each byte comes from a `ByteSource`, which omits the guard of the stream where it has no effect.
#include "components/componentManager/bufferio.h"

#include "components/componentManager/buffers/byteSource.h"
#include "components/componentManager/text/plainBytes.h"

#include <algorithm>
#include <cstddef>
#include <cwctype>
#include <istream>
#include <string>
#include <string_view>

namespace Mz {

namespace {

constexpr const char* source = "components/componentManager/bufferio";

/// A sequence of this many bytes that is not a character is an error.
constexpr int maximumPendingBytes = 4;

constexpr int endOfInput = ByteSource::endOfInput;

[[noreturn]] void throwWrite(int line) {
    throw QrStreamEx::ExWrite(source, line);
}

void throwIfBad(const std::istream& in, int line) {
    if (in.bad())
        throw QrStreamEx::ExReadError(source, line);
}

/// Returns the next byte, 0 to 255, or -1 if there is none. Looks at the stream anew for each byte:
/// a foreign buffer may change its state.
int fetch(std::istream& in) {
    return ByteSource(in).get();
}

void putBack(std::istream& in, char byte) {
    ByteSource(in).putBack(byte);
}

/// Puts back the bytes from `begin` to `end`, last first, so that they are read again in order.
void putBack(std::istream& in, const char* begin, const char* end) {
    while (end != begin)
        putBack(in, *--end);
}

/// Reads up to `wanted` characters of one byte each, from what the buffer holds. A NUL is delivered
/// but never consumed, so it fills the rest.
int readPlainCharacters(const ByteSource& source, wchar_t* characters, int wanted) {
    for (int stored = 0; stored < wanted;) {
        if (source.peek() < 0)
            return stored;
        const std::string_view held =
            source.held().substr(0, static_cast<std::size_t>(wanted - stored));
        const std::string_view taken = held.substr(0, held.find('\0'));
        for (const char byte : taken)
            characters[stored++] = static_cast<wchar_t>(static_cast<unsigned char>(byte));
        source.take(static_cast<std::ptrdiff_t>(taken.size()));
        if (taken.size() < held.size()) {
            std::fill(characters + stored, characters + wanted, L'\0');
            return wanted;
        }
    }
    return wanted;
}

} // namespace

void throwBrokenInput() {
    throw QrStreamEx::ExReadError(source, __LINE__);
}

QrInBuffer::QrInBuffer(std::istream* in) : in(in) {}

QrInBuffer::~QrInBuffer() = default;

bool QrInBuffer::isBufferIgnored() const {
    return false;
}

int QrInBuffer::read(void* data, int size) {
    if (size < 1) {
        throwIfBad(*in, __LINE__);
        return 0;
    }
    return ByteSource(*in).read(static_cast<char*>(data), size);
}

int QrInBuffer::read() {
    const int byte = fetch(*in);
    throwIfBad(*in, __LINE__);
    return byte;
}

int QrInBuffer::readChar(char& c) {
    const int byte = fetch(*in);
    throwIfBad(*in, __LINE__);
    if (byte == endOfInput)
        return 0;
    c = static_cast<char>(byte);
    return 1;
}

int QrInBuffer::readChar(wchar_t& c) {
    return readChar(&c, 1, 1);
}

int QrInBuffer::readChar(char* buf, int size, int count) {
    if (count == 0)
        return 0;
    const platform::CharacterConverter converter = bufferedConverter();
    int used = 0;
    int fetched = 0;
    int characters = 0;
    while (fetched < size && characters != count) {
        const int byte = fetch(*in);
        buf[fetched] = static_cast<char>(byte);
        throwIfBad(*in, __LINE__);
        if (byte == endOfInput)
            break;
        ++fetched;
        wchar_t ignored;
        const auto pending = static_cast<std::size_t>(fetched - used);
        const int length = converter.decode({buf + used, pending}, ignored);
        if (length == 0)
            break; // A NUL counts for the rest of the request and stays unread.
        if (length > 0) {
            used += length;
            ++characters;
        } else if (fetched - used >= maximumPendingBytes) {
            throw QrStreamEx::ExReadError(source, __LINE__);
        }
    }
    putBack(*in, buf + used, buf + fetched);
    throwIfBad(*in, __LINE__);
    return used;
}

int QrInBuffer::readChar(wchar_t* buf, int size, int count) {
    const int wanted = std::min(size, count);
    if (wanted < 1)
        return 0;
    const platform::CharacterConverter converter = bufferedConverter();
    if (converter.plainBytes())
        if (const ByteSource bytes(*in); bytes.isFree())
            return readPlainCharacters(bytes, buf, wanted);
    char pending[maximumPendingBytes];
    int pendingBytes = 0;
    int stored = 0;
    while (stored < wanted) {
        const int byte = fetch(*in);
        throwIfBad(*in, __LINE__);
        if (byte == endOfInput)
            break;
        pending[pendingBytes++] = static_cast<char>(byte);
        const int length =
            converter.decode({pending, static_cast<std::size_t>(pendingBytes)}, buf[stored]);
        if (length > 0) {
            ++stored;
            pendingBytes = 0;
        } else if (length == 0) {
            // A NUL is delivered but never consumed, so it fills the rest.
            std::fill(buf + stored, buf + wanted, L'\0');
            stored = wanted;
        } else if (pendingBytes == maximumPendingBytes) {
            throw QrStreamEx::ExReadError(source, __LINE__);
        }
    }
    putBack(*in, pending, pending + pendingBytes);
    throwIfBad(*in, __LINE__);
    return stored;
}

void QrInBuffer::skipWhiteSpace(int count) {
    for (; count > 0; --count) {
        const int byte = fetch(*in);
        throwIfBad(*in, __LINE__);
        if (byte == endOfInput)
            return;
        // A byte from 0x80 keeps its sign, so it is not white space in any locale.
        const auto character = static_cast<std::wint_t>(static_cast<signed char>(byte));
        if (!std::iswspace(character)) {
            putBack(*in, static_cast<char>(byte));
            return;
        }
        if (byte != '\r')
            continue;
        const int next = fetch(*in);
        throwIfBad(*in, __LINE__);
        if (next == endOfInput)
            return;
        if (next != '\n') {
            putBack(*in, static_cast<char>(next));
            return;
        }
    }
}

void QrInBuffer::ungetc(wchar_t c) {
    char bytes[platform::maximumCharacterBytes];
    const int length = bufferedConverter().encode(c, bytes);
    if (length < 0)
        throw QrStreamEx::ExReadError(source, __LINE__);
    putBack(*in, bytes, bytes + length);
    throwIfBad(*in, __LINE__);
}

void QrInBuffer::ungetc(char c) {
    putBack(*in, c);
}

bool QrInBuffer::canSeek() const {
    return tell() != -1;
}

int64 QrInBuffer::seek(int64 offset, int origin) {
    if (offset == 0 && origin == 1)
        return tell();
    if (origin < 0 || origin > 2)
        throw QrStreamEx::ExReadError(source, __LINE__);
    constexpr std::ios::seekdir directions[] = {std::ios::beg, std::ios::cur, std::ios::end};
    // A seek clears the end of input before it begins.
    ignoringExceptions([&] { in->clear(in->rdstate() & ~std::ios::eofbit); });
    operate(*in, [&] { in->seekg(offset, directions[origin]); });
    const int64 position = tell();
    if (position == -1)
        throw QrStreamEx::ExReadError(source, __LINE__);
    return position;
}

int64 QrInBuffer::tell() const {
    int64 position = -1;
    operate(*in, [&] { position = in->tellg(); });
    return position;
}

int64 QrInBuffer::heldBytes() const {
    const ByteSource source(*in);
    return source.isFree() ? static_cast<int64>(source.held().size()) : -1;
}

void QrInBuffer::writeObject(const QrCastable*, QrStream&, const wchar_t*, const wchar_t*) {
    throw QrStreamEx::ExWriteObjectImp(source, __LINE__);
}

QrRef<QrCastable> QrInBuffer::readObject(QrStream&, const QrUid*, const wchar_t*, const wchar_t*) {
    throw QrStreamEx::ExReadObjectImp(source, __LINE__);
}

void QrInBuffer::write(const void*, int) {
    throwWrite(__LINE__);
}

void QrInBuffer::write(char) {
    throwWrite(__LINE__);
}

void QrInBuffer::writeEol() {
    throwWrite(__LINE__);
}

void QrInBuffer::writeSpace() {
    throwWrite(__LINE__);
}

int QrInBuffer::writeChar(const wchar_t*, int) {
    throwWrite(__LINE__);
}

int QrInBuffer::writeChar(const char*, int) {
    throwWrite(__LINE__);
}

void QrInBuffer::writeChar(wchar_t) {
    throwWrite(__LINE__);
}

void QrInBuffer::writeChar(char) {
    throwWrite(__LINE__);
}

} // namespace Mz
