// SPDX-License-Identifier: BSL-1.0
/// The stream that writes every value in binary form.
#pragma once

#include "components/componentManager/export.h"
#include "components/componentManager/stream.h"

#include <string>

namespace Mz {

/// The binary stream: a `QrStream` that writes single values in binary form too.
///
/// `QrStream` describes the form. A single `wchar_t` is deliberately an exception: it is written as
/// its code in decimal text, after which the next binary value begins on a new line, and it cannot
/// be read. Arrays of `wchar_t` are binary.
///
/// The IO writes the characters of strings in the current locale. Read them in the same locale.
class MZ_COMPONENT_MANAGER_API QrBinaryStream : public QrStream {
  public:
    /// Takes a reference to the `QrBufferedIO` of `io`.
    ///
    /// \throws QrComponentManagerEx::ExBadCast if `io` is null or has no `QrBufferedIO`
    explicit QrBinaryStream(QrCastable* io);
    ~QrBinaryStream() override;

    bool isBinaryStream() const override;

    using QrStream::operator<<;
    using QrStream::operator>>;

    QrStream& operator<<(unsigned long long value) override;
    QrStream& operator<<(int64 value) override;
    QrStream& operator<<(const std::wstring& value) override;
    QrStream& operator<<(double value) override;
    QrStream& operator<<(float value) override;
    QrStream& operator<<(bool value) override;
    QrStream& operator<<(unsigned long value) override;
    QrStream& operator<<(long value) override;
    QrStream& operator<<(unsigned int value) override;
    QrStream& operator<<(int value) override;
    QrStream& operator<<(unsigned short value) override;
    QrStream& operator<<(short value) override;
    QrStream& operator<<(unsigned char value) override;
    QrStream& operator<<(char value) override;

    /// Each reads one value.
    ///
    /// \throws QrStreamEx::ExReadError if the value is not complete
    QrStream& operator>>(unsigned long long& value) override;
    QrStream& operator>>(int64& value) override;
    QrStream& operator>>(std::wstring& value) override;
    QrStream& operator>>(double& value) override;
    QrStream& operator>>(float& value) override;
    QrStream& operator>>(bool& value) override;
    QrStream& operator>>(unsigned long& value) override;
    QrStream& operator>>(long& value) override;
    QrStream& operator>>(unsigned int& value) override;
    QrStream& operator>>(int& value) override;
    QrStream& operator>>(unsigned short& value) override;
    QrStream& operator>>(short& value) override;
    QrStream& operator>>(unsigned char& value) override;
    QrStream& operator>>(char& value) override;

  private:
    template <class T>
    QrStream& writeOne(const T& value);
    template <class T>
    QrStream& readOne(T& value);
};

} // namespace Mz
