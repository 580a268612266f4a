// SPDX-License-Identifier: BSL-1.0
/// Each array is a sequence of single values. Writing calls the base's `<<` by name. Reading does
/// not call `>>`, which throws: here the end of the input is a short count. Numbers are read by
/// `formattedRead` with the format of the type.
#include "components/componentManager/textStream.h"

namespace Mz {

namespace {

constexpr const char* source = "components/componentManager/textStream";

} // namespace

QrTextStream::QrTextStream(QrCastable* io) : QrStream(io) {}

QrTextStream::~QrTextStream() = default;

bool QrTextStream::isTextStream() const {
    return true;
}

template <class T>
void QrTextStream::writeText(const T& values, int count) {
    for (const T* value = &values; count > 0; ++value, --count)
        QrStream::operator<<(*value);
}

template <class T>
int QrTextStream::readText(const wchar_t* format, T& values, int count) {
    return readThrough<T, T>(format, values, count);
}

/// Reads each value as a `Number`, a type that has a format, and stores its low bits.
template <class T, class Number>
int QrTextStream::readThrough(const wchar_t* format, T& values, int count) {
    int done = 0;
    for (T* value = &values; done < count; ++value, ++done) {
        Number number{};
        if (formattedRead(format, &number) != 1)
            break;
        *value = static_cast<T>(number);
    }
    return done;
}

void QrTextStream::write(const unsigned long long& values, int count) {
    writeText(values, count);
}

void QrTextStream::write(const int64& values, int count) {
    writeText(values, count);
}

void QrTextStream::write(const std::wstring& values, int count) {
    writeText(values, count);
}

void QrTextStream::write(const double& values, int count) {
    writeText(values, count);
}

void QrTextStream::write(const float& values, int count) {
    writeText(values, count);
}

void QrTextStream::write(const bool& values, int count) {
    writeText(values, count);
}

void QrTextStream::write(const unsigned long& values, int count) {
    writeText(values, count);
}

void QrTextStream::write(const long& values, int count) {
    writeText(values, count);
}

void QrTextStream::write(const unsigned int& values, int count) {
    writeText(values, count);
}

void QrTextStream::write(const int& values, int count) {
    writeText(values, count);
}

void QrTextStream::write(const unsigned short& values, int count) {
    writeText(values, count);
}

void QrTextStream::write(const short& values, int count) {
    writeText(values, count);
}

void QrTextStream::write(const unsigned char& values, int count) {
    writeText(values, count);
}

void QrTextStream::write(const wchar_t& values, int count) {
    writeText(values, count);
}

void QrTextStream::write(const char& values, int count) {
    writeText(values, count);
}

int QrTextStream::read(unsigned long long& values, int count) {
    return readText(L"%I64u", values, count);
}

int QrTextStream::read(int64& values, int count) {
    return readText(L"%I64d", values, count);
}

int QrTextStream::read(std::wstring& values, int count) {
    int done = 0;
    for (std::wstring* value = &values; done < count; ++value, ++done) {
        int length = 0;
        if (read(length, 1) == 0)
            break;
        skipSeparator();
        if (!readCharacters(*value, length))
            throw QrStreamEx::ExReadError(source, __LINE__);
    }
    return done;
}

int QrTextStream::read(double& values, int count) {
    return readText(L"%lg", values, count);
}

int QrTextStream::read(float& values, int count) {
    return readText(L"%g", values, count);
}

int QrTextStream::read(bool& values, int count) {
    int done = 0;
    for (bool* value = &values; done < count; ++value, ++done) {
        skipSeparator();
        wchar_t digit;
        if (io().readChar(&digit, 1, 1) == 0)
            break;
        *value = digit != L'0';
    }
    return done;
}

int QrTextStream::read(unsigned long& values, int count) {
    return readText(L"%lu", values, count);
}

int QrTextStream::read(long& values, int count) {
    return readText(L"%ld", values, count);
}

int QrTextStream::read(unsigned int& values, int count) {
    return readText(L"%u", values, count);
}

int QrTextStream::read(int& values, int count) {
    return readText(L"%d", values, count);
}

int QrTextStream::read(unsigned short& values, int count) {
    return readText(L"%hu", values, count);
}

int QrTextStream::read(short& values, int count) {
    return readText(L"%hd", values, count);
}

int QrTextStream::read(unsigned char& values, int count) {
    return readThrough<unsigned char, unsigned int>(L"%u", values, count);
}

int QrTextStream::read(char& values, int count) {
    return readThrough<char, int>(L"%d", values, count);
}

} // namespace Mz
