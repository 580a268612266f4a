/// The stream whose data is text throughout.
#pragma once

#include "components/componentManager/export.h"
#include "components/componentManager/stream.h"

namespace Mz {

/// A `QrStream` that writes and reads counted values as text too, in the form that `QrStream`
/// describes, edges included: readable, separated by blanks, the same under every locale.
///
/// One operation stays as in the base, on purpose: counted reading of `wchar_t` is binary.
class MZ_COMPONENT_MANAGER_API QrTextStream : public QrStream {
  public:
    /// Takes a reference on the `QrBufferedIO` of `io`. Throws `QrComponentManagerEx::ExBadCast`
    /// when it has none or is null.
    explicit QrTextStream(QrCastable* io);
    ~QrTextStream() override;

    bool isTextStream() const override;

    using QrStream::read;
    using QrStream::write;

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

    /// Each stops at the first value that cannot be read and returns how many could. Strings whose
    /// characters run short raise `QrStreamEx::ExReadError`.
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
