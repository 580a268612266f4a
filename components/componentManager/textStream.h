// SPDX-License-Identifier: BSL-1.0
/// The stream that writes every value as text.
#pragma once

#include "components/componentManager/export.h"
#include "components/componentManager/stream.h"

#include <string>

namespace Mz {

/// The text stream: a `QrStream` that writes and reads arrays as text too.
///
/// The text is legible, separated by blanks, and its numbers do not depend on the locale.
/// `QrStream` describes the form and its special cases. An array of `wchar_t` is written as text
/// but, deliberately, read as binary data.
class MZ_COMPONENT_MANAGER_API QrTextStream : public QrStream {
  public:
    /// Takes a reference to the `QrBufferedIO` of `io`.
    ///
    /// \throws QrComponentManagerEx::ExBadCast if `io` is null or has no `QrBufferedIO`
    explicit QrTextStream(QrCastable* io);
    ~QrTextStream() override;

    bool isTextStream() const override;

    using QrStream::read;
    using QrStream::write;

    /// Each writes `count` values, as `<<` does; a count below 1 writes nothing.
    void write(const unsigned long long& values, int count) override;
    void write(const int64& values, int count) override;
    void write(const std::wstring& values, int count) override;
    void write(const double& values, int count) override;
    void write(const float& values, int count) override;
    void write(const bool& values, int count) override;
    void write(const unsigned long& values, int count) override;
    void write(const long& values, int count) override;
    void write(const unsigned int& values, int count) override;
    void write(const int& values, int count) override;
    void write(const unsigned short& values, int count) override;
    void write(const short& values, int count) override;
    void write(const unsigned char& values, int count) override;
    void write(const wchar_t& values, int count) override;
    void write(const char& values, int count) override;

    /// Each reads up to `count` values and stops at the first that cannot be read.
    ///
    /// \return the number of values read
    /// \throws QrStreamEx::ExReadError if a string has fewer characters than its length
    int read(unsigned long long& values, int count) override;
    int read(int64& values, int count) override;
    int read(std::wstring& values, int count) override;
    int read(double& values, int count) override;
    int read(float& values, int count) override;
    int read(bool& values, int count) override;
    int read(unsigned long& values, int count) override;
    int read(long& values, int count) override;
    int read(unsigned int& values, int count) override;
    int read(int& values, int count) override;
    int read(unsigned short& values, int count) override;
    int read(short& values, int count) override;
    int read(unsigned char& values, int count) override;
    int read(char& values, int count) override;

  private:
    template <class T>
    void writeText(const T& values, int count);
    template <class T>
    int readText(const wchar_t* format, T& values, int count);
    template <class T, class Number>
    int readThrough(const wchar_t* format, T& values, int count);
};

} // namespace Mz
