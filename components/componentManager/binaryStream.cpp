// SPDX-License-Identifier: BSL-1.0
/// Each single value is an array of one: the operators call the base's `write` and `read`. They
/// name the base class, so these calls are not virtual.
#include "components/componentManager/binaryStream.h"

namespace Mz {

QrBinaryStream::QrBinaryStream(QrCastable* io) : QrStream(io) {}

QrBinaryStream::~QrBinaryStream() = default;

bool QrBinaryStream::isBinaryStream() const {
    return true;
}

template <class T>
QrStream& QrBinaryStream::writeOne(const T& value) {
    QrStream::write(value, 1);
    return *this;
}

template <class T>
QrStream& QrBinaryStream::readOne(T& value) {
    if (QrStream::read(value, 1) == 0)
        throw QrStreamEx::ExReadError("components/componentManager/binaryStream", __LINE__);
    return *this;
}

QrStream& QrBinaryStream::operator<<(unsigned long long value) {
    return writeOne(value);
}

QrStream& QrBinaryStream::operator<<(int64 value) {
    return writeOne(value);
}

QrStream& QrBinaryStream::operator<<(const std::wstring& value) {
    return writeOne(value);
}

QrStream& QrBinaryStream::operator<<(double value) {
    return writeOne(value);
}

QrStream& QrBinaryStream::operator<<(float value) {
    return writeOne(value);
}

QrStream& QrBinaryStream::operator<<(bool value) {
    return writeOne(value);
}

QrStream& QrBinaryStream::operator<<(unsigned long value) {
    return writeOne(value);
}

QrStream& QrBinaryStream::operator<<(long value) {
    return writeOne(value);
}

QrStream& QrBinaryStream::operator<<(unsigned int value) {
    return writeOne(value);
}

QrStream& QrBinaryStream::operator<<(int value) {
    return writeOne(value);
}

QrStream& QrBinaryStream::operator<<(unsigned short value) {
    return writeOne(value);
}

QrStream& QrBinaryStream::operator<<(short value) {
    return writeOne(value);
}

QrStream& QrBinaryStream::operator<<(unsigned char value) {
    return writeOne(value);
}

QrStream& QrBinaryStream::operator<<(char value) {
    return writeOne(value);
}

QrStream& QrBinaryStream::operator>>(unsigned long long& value) {
    return readOne(value);
}

QrStream& QrBinaryStream::operator>>(int64& value) {
    return readOne(value);
}

QrStream& QrBinaryStream::operator>>(std::wstring& value) {
    return readOne(value);
}

QrStream& QrBinaryStream::operator>>(double& value) {
    return readOne(value);
}

QrStream& QrBinaryStream::operator>>(float& value) {
    return readOne(value);
}

QrStream& QrBinaryStream::operator>>(bool& value) {
    return readOne(value);
}

QrStream& QrBinaryStream::operator>>(unsigned long& value) {
    return readOne(value);
}

QrStream& QrBinaryStream::operator>>(long& value) {
    return readOne(value);
}

QrStream& QrBinaryStream::operator>>(unsigned int& value) {
    return readOne(value);
}

QrStream& QrBinaryStream::operator>>(int& value) {
    return readOne(value);
}

QrStream& QrBinaryStream::operator>>(unsigned short& value) {
    return readOne(value);
}

QrStream& QrBinaryStream::operator>>(short& value) {
    return readOne(value);
}

QrStream& QrBinaryStream::operator>>(unsigned char& value) {
    return readOne(value);
}

QrStream& QrBinaryStream::operator>>(char& value) {
    return readOne(value);
}

} // namespace Mz
