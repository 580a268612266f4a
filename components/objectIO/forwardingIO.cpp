// SPDX-License-Identifier: BSL-1.0
/// Forwards every operation to the inner IO, one call for one call, so that a derived class that
/// overrides some operations leaves the calls of the others as they are. The reference keeps a
/// counted inner IO alive.
#include "components/objectIO/objectIO.h"

namespace Mz {

QrForwardingIO::QrForwardingIO(QrCastable* io)
    : target(QrPtr<QrBufferedIO>::adopt(safeCast<QrBufferedIO>(io))) {}

QrForwardingIO::~QrForwardingIO() = default;

bool QrForwardingIO::isBufferIgnored() const {
    return inner().isBufferIgnored();
}

void QrForwardingIO::writeObject(const QrCastable* obj, QrStream& s, const wchar_t* a,
                                 const wchar_t* b) {
    inner().writeObject(obj, s, a, b);
}

QrRef<QrCastable> QrForwardingIO::readObject(QrStream& s, const QrUid* id, const wchar_t* a,
                                             const wchar_t* b) {
    return inner().readObject(s, id, a, b);
}

void QrForwardingIO::write(const void* data, int size) {
    inner().write(data, size);
}

void QrForwardingIO::write(char c) {
    inner().write(c);
}

int QrForwardingIO::read(void* data, int size) {
    return inner().read(data, size);
}

int QrForwardingIO::read() {
    return inner().read();
}

void QrForwardingIO::writeEol() {
    inner().writeEol();
}

void QrForwardingIO::writeSpace() {
    inner().writeSpace();
}

int QrForwardingIO::writeChar(const wchar_t* s, int count) {
    return inner().writeChar(s, count);
}

int QrForwardingIO::writeChar(const char* s, int size) {
    return inner().writeChar(s, size);
}

void QrForwardingIO::writeChar(wchar_t c) {
    inner().writeChar(c);
}

void QrForwardingIO::writeChar(char c) {
    inner().writeChar(c);
}

void QrForwardingIO::skipWhiteSpace(int count) {
    inner().skipWhiteSpace(count);
}

int QrForwardingIO::readChar(wchar_t* buf, int size, int count) {
    return inner().readChar(buf, size, count);
}

int QrForwardingIO::readChar(char* buf, int size, int count) {
    return inner().readChar(buf, size, count);
}

int QrForwardingIO::readChar(wchar_t& c) {
    return inner().readChar(c);
}

int QrForwardingIO::readChar(char& c) {
    return inner().readChar(c);
}

void QrForwardingIO::ungetc(wchar_t c) {
    inner().ungetc(c);
}

void QrForwardingIO::ungetc(char c) {
    inner().ungetc(c);
}

bool QrForwardingIO::canSeek() const {
    return inner().canSeek();
}

int64 QrForwardingIO::seek(int64 offset, int origin) {
    return inner().seek(offset, origin);
}

int64 QrForwardingIO::tell() const {
    return inner().tell();
}

} // namespace Mz
