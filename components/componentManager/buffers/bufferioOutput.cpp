// SPDX-License-Identifier: BSL-1.0
/// The output buffer converts wide characters one by one and writes the bytes of each; it keeps no
/// data. Where byte and character code are equal and nothing foreign can observe the pieces, it
/// writes text in blocks. All bytes go to a `ByteSink`, which omits the guard of the stream where
/// it has no effect.
#include "components/componentManager/bufferio.h"

#include "components/componentManager/buffers/byteSink.h"
#include "components/componentManager/text/plainBytes.h"

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <ostream>
#include <string>
#include <string_view>

namespace Mz {

namespace {

constexpr const char* source = "components/componentManager/bufferio";

[[noreturn]] void throwRead(int line) {
    throw QrStreamEx::ExRead(source, line);
}

void throwIfBad(const std::ostream& out, int line) {
    if (out.bad())
        throw QrStreamEx::ExWriteError(source, line);
}

void put(std::ostream& out, char byte) {
    ByteSink(out).put(byte);
}

void put(std::ostream& out, const void* data, int size) {
    if (size > 0)
        ByteSink(out).put(static_cast<const char*>(data), size);
}

void putCharacter(std::ostream& out, const platform::CharacterConverter& converter, wchar_t c) {
    char bytes[platform::maximumCharacterBytes];
    const int length = converter.encode(c, bytes);
    if (length < 0)
        throw QrStreamEx::ExWriteError(source, __LINE__);
    put(out, bytes, length);
}

/// Writes characters of one byte each, in blocks. Throws at one that is larger; those before it are
/// written.
void putPlainCharacters(std::ostream& out, const wchar_t* text, int count) {
    constexpr int blockSize = 256;
    constexpr std::uint32_t largestByte = 0xFF;
    char block[blockSize];
    for (int done = 0; done < count;) {
        const int wanted = std::min(blockSize, count - done);
        int ready = 0;
        for (; ready < wanted; ++ready) {
            const auto code = static_cast<std::uint32_t>(text[done + ready]);
            if (code > largestByte)
                break;
            block[ready] = static_cast<char>(code);
        }
        put(out, block, ready);
        if (ready < wanted)
            throw QrStreamEx::ExWriteError(source, __LINE__);
        done += ready;
    }
}

/// Returns the number of characters in `text`, where a NUL counts as one, or -1 if it is not valid.
int countCharacters(std::string_view text) {
    const platform::CharacterConverter converter = bufferedConverter();
    if (converter.plainBytes())
        return static_cast<int>(text.size());
    int count = 0;
    for (; !text.empty(); ++count) {
        wchar_t ignored;
        const int length = converter.decode(text, ignored);
        if (length < 0)
            return -1;
        text.remove_prefix(length ? static_cast<std::size_t>(length) : 1);
    }
    return count;
}

} // namespace

void throwBrokenOutput() {
    throw QrStreamEx::ExWriteError(source, __LINE__);
}

QrOutBuffer::QrOutBuffer(std::ostream* out) : out(out) {}

QrOutBuffer::~QrOutBuffer() = default;

bool QrOutBuffer::isBufferIgnored() const {
    return false;
}

void QrOutBuffer::write(const void* data, int size) {
    put(*out, data, size);
    throwIfBad(*out, __LINE__);
}

void QrOutBuffer::write(char c) {
    put(*out, c);
    throwIfBad(*out, __LINE__);
}

void QrOutBuffer::writeEol() {
    put(*out, '\n');
}

void QrOutBuffer::writeSpace() {
    put(*out, ' ');
}

int QrOutBuffer::writeChar(const wchar_t* s, int count) {
    const platform::CharacterConverter converter = bufferedConverter();
    if (converter.plainBytes() && ByteSink(*out).isFree())
        putPlainCharacters(*out, s, count);
    else
        for (int index = 0; index < count; ++index)
            putCharacter(*out, converter, s[index]);
    throwIfBad(*out, __LINE__);
    return count;
}

int QrOutBuffer::writeChar(const char* s, int size) {
    const auto length = static_cast<std::size_t>(size > 0 ? size : 0);
    const int count = countCharacters({s, length});
    if (count < 0)
        throw QrStreamEx::ExWriteError(source, __LINE__);
    put(*out, s, size);
    throwIfBad(*out, __LINE__);
    return count;
}

void QrOutBuffer::writeChar(wchar_t c) {
    putCharacter(*out, bufferedConverter(), c);
    throwIfBad(*out, __LINE__);
}

void QrOutBuffer::writeChar(char c) {
    if (countCharacters({&c, 1}) < 0)
        throw QrStreamEx::ExWriteError(source, __LINE__);
    put(*out, c);
    throwIfBad(*out, __LINE__);
}

bool QrOutBuffer::canSeek() const {
    return tell() != -1;
}

int64 QrOutBuffer::seek(int64 offset, int origin) {
    if (offset == 0 && origin == 1)
        return tell();
    if (origin < 0 || origin > 2)
        throw QrStreamEx::ExWriteError(source, __LINE__);
    constexpr std::ios::seekdir directions[] = {std::ios::beg, std::ios::cur, std::ios::end};
    operate(*out, [&] { out->seekp(offset, directions[origin]); });
    const int64 position = tell();
    if (position == -1)
        throw QrStreamEx::ExWriteError(source, __LINE__);
    return position;
}

int64 QrOutBuffer::tell() const {
    int64 position = -1;
    operate(*out, [&] { position = out->tellp(); });
    return position;
}

void QrOutBuffer::writeObject(const QrCastable*, QrStream&, const wchar_t*, const wchar_t*) {
    throw QrStreamEx::ExWriteObjectImp(source, __LINE__);
}

QrRef<QrCastable> QrOutBuffer::readObject(QrStream&, const QrUid*, const wchar_t*, const wchar_t*) {
    throw QrStreamEx::ExReadObjectImp(source, __LINE__);
}

int QrOutBuffer::read(void*, int) {
    throwRead(__LINE__);
}

int QrOutBuffer::read() {
    throwRead(__LINE__);
}

void QrOutBuffer::skipWhiteSpace(int) {
    throwRead(__LINE__);
}

int QrOutBuffer::readChar(wchar_t*, int, int) {
    throwRead(__LINE__);
}

int QrOutBuffer::readChar(char*, int, int) {
    throwRead(__LINE__);
}

int QrOutBuffer::readChar(wchar_t&) {
    throwRead(__LINE__);
}

int QrOutBuffer::readChar(char&) {
    throwRead(__LINE__);
}

void QrOutBuffer::ungetc(wchar_t) {
    throwRead(__LINE__);
}

void QrOutBuffer::ungetc(char) {
    throwRead(__LINE__);
}

} // namespace Mz
