/// The stream whose data is binary throughout.
#pragma once

#include "components/componentManager/export.h"
#include "components/componentManager/stream.h"

namespace Mz {

/// A `QrStream` that writes single values as binary data too, in the form that `QrStream`
/// describes.
///
/// One type stays as in the base, on purpose: a single `wchar_t` is written as its code in decimal
/// text, after which the next binary value starts on a new line, and can never be read; arrays of
/// `wchar_t` are binary.
///
/// The characters of strings take the form that the IO gives to wide characters, which is that of
/// the current locale: write and read them under the same one.
class MZ_COMPONENT_MANAGER_API QrBinaryStream : public QrStream {
  public:
    /// Takes a reference on the `QrBufferedIO` of `io`. Throws `QrComponentManagerEx::ExBadCast`
    /// when it has none or is null.
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

    /// Each raises `QrStreamEx::ExReadError` when the value cannot be read whole.
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
