// SPDX-License-Identifier: BSL-1.0
/// The base of the persistent streams: typed values on a `QrBufferedIO`, as text or binary data.
#pragma once

#include "components/componentManager/bufferio.h"
#include "components/componentManager/export.h"
#include "components/componentManager/persistant.h"

#include <string>
#include <type_traits>

namespace Mz {

/// The stream to which persistent objects write themselves and from which they read themselves.
///
/// Each basic type has a single-value operator (`<<`, `>>`) and an array function (`write`,
/// `read`), whose reference names the first of `count` consecutive values:
///
///     stream << 3;
///     stream.write(points.front(), 3);
///
/// This base writes single values as text and arrays as binary data. `QrTextStream` writes both as
/// text, `QrBinaryStream` both as binary data.
///
/// **Text.** Values are separated by a blank, or by a line end once the line has more than 70
/// characters. The separator is written before the next value. Numbers have the form of the "C"
/// locale, whatever the locale of the process. A `float` has 9 significant digits, a `double` 16. A
/// `char` is written as its code. Existing files rely on three special cases:
/// - A `bool` is one character, "0" or "1", with *no* separator after it.
/// - A string is its length, a separator and its characters, unquoted. Reading does not skip the
///   separator: the string read begins with it, and the last character stays unread. Use the
///   binary form for strings.
/// - A `wchar_t` is written as its code and cannot be read: `operator>>(wchar_t&)` always throws
///   `QrStreamEx::ExReadError`.
///
/// **Binary.** Values are big-endian. `bool` and the `char` types have 1 byte, `short` and
/// `wchar_t` 2, `int`, `long` and `float` 4, `int64` and `double` 8. A string is its length in
/// characters (4 bytes) and its characters as the IO writes wide ones.
///
/// **Widths.** They are the same on every platform. A `long` or `wchar_t` that does not fit throws
/// `QrStreamEx::ExWriteError`. The types of `<cstdint>` name different types, so `std::int64_t`,
/// `std::uint64_t` and `std::size_t` have 4 bytes on Linux (`long`) and 8 on Windows (`long long`).
/// Use `int64` or `unsigned long long` for 64 bits, and convert a size explicitly.
///
/// **Failures.** A single value that cannot be read throws `QrStreamEx::ExReadError`; the array
/// functions return the number of complete values. If the medium fails, the exception of the IO
/// passes through. What was read or written before remains. Counts and lengths in the input are not
/// trusted: memory grows with the data that arrives.
///
/// Used by one thread at a time. The order of the virtual functions is ABI.
class MZ_COMPONENT_MANAGER_API QrStream {
  public:
    /// Releases the objects of the post-load list, without notifying them, then the IO.
    virtual ~QrStream();
    QrStream(const QrStream&) = delete;
    QrStream& operator=(const QrStream&) = delete;

    /// Returns whether every value is text: true for `QrTextStream`.
    virtual bool isTextStream() const;
    /// Returns whether values are binary data throughout: true for `QrBinaryStream`.
    virtual bool isBinaryStream() const;

    /// Requests a notification of `obj` after the load (`QrPersistant::loadFinished`). Called by an
    /// object's `read`. Takes a reference to `obj`. Each object that is being read has one request;
    /// a second call replaces it. Has no effect outside `readObject`.
    virtual void postLoad(QrPersistant* obj);

    /// Moves the objects to notify to the end of `target`, as `QrPostLoadList::transfer` does.
    virtual void transfer(QrPostLoadList& target);

    /// Returns the number of the current line, from 1, for messages; 1 if the position is unknown.
    /// Seeks to the beginning of the input and reads up to the current position.
    virtual int computeLineNb();

    /// Each writes `count` values; a count below 1 writes nothing.
    ///
    /// \throws QrStreamEx::ExWriteError if a value does not fit its width; those before it are
    ///         written
    virtual void write(const unsigned long long& values, int count);
    virtual void write(const int64& values, int count);
    virtual void write(const std::wstring& values, int count);
    virtual void write(const double& values, int count);
    virtual void write(const float& values, int count);
    virtual void write(const bool& values, int count);
    virtual void write(const unsigned long& values, int count);
    virtual void write(const long& values, int count);
    virtual void write(const unsigned int& values, int count);
    virtual void write(const int& values, int count);
    virtual void write(const unsigned short& values, int count);
    virtual void write(const short& values, int count);
    virtual void write(const unsigned char& values, int count);
    virtual void write(const wchar_t& values, int count);
    virtual void write(const char& values, int count);

    /// Each writes one value and returns the stream.
    ///
    /// \throws QrStreamEx::ExWriteError if the value does not fit its width
    virtual QrStream& operator<<(unsigned long long value);
    virtual QrStream& operator<<(int64 value);
    virtual QrStream& operator<<(const std::wstring& value);
    virtual QrStream& operator<<(double value);
    virtual QrStream& operator<<(float value);
    virtual QrStream& operator<<(bool value);
    virtual QrStream& operator<<(unsigned long value);
    virtual QrStream& operator<<(long value);
    virtual QrStream& operator<<(unsigned int value);
    virtual QrStream& operator<<(int value);
    virtual QrStream& operator<<(unsigned short value);
    virtual QrStream& operator<<(short value);
    virtual QrStream& operator<<(unsigned char value);
    virtual QrStream& operator<<(wchar_t value);
    virtual QrStream& operator<<(char value);

    /// Each reads up to `count` values.
    ///
    /// \return the number of complete values; 0 for a count below 1
    /// \throws QrStreamEx::ExReadError if a string has fewer characters than its length
    virtual int read(unsigned long long& values, int count);
    virtual int read(int64& values, int count);
    virtual int read(std::wstring& values, int count);
    virtual int read(double& values, int count);
    virtual int read(float& values, int count);
    virtual int read(bool& values, int count);
    virtual int read(unsigned long& values, int count);
    virtual int read(long& values, int count);
    virtual int read(unsigned int& values, int count);
    virtual int read(int& values, int count);
    virtual int read(unsigned short& values, int count);
    virtual int read(short& values, int count);
    virtual int read(unsigned char& values, int count);
    virtual int read(wchar_t& values, int count);
    virtual int read(char& values, int count);

    /// Each reads one value and returns the stream.
    ///
    /// \throws QrStreamEx::ExReadError if there is no value, and always for `wchar_t`
    virtual QrStream& operator>>(unsigned long long& value);
    virtual QrStream& operator>>(int64& value);
    virtual QrStream& operator>>(std::wstring& value);
    virtual QrStream& operator>>(double& value);
    virtual QrStream& operator>>(float& value);
    virtual QrStream& operator>>(bool& value);
    virtual QrStream& operator>>(unsigned long& value);
    virtual QrStream& operator>>(long& value);
    virtual QrStream& operator>>(unsigned int& value);
    virtual QrStream& operator>>(int& value);
    virtual QrStream& operator>>(unsigned short& value);
    virtual QrStream& operator>>(short& value);
    virtual QrStream& operator>>(unsigned char& value);
    virtual QrStream& operator>>(wchar_t& value);
    virtual QrStream& operator>>(char& value);

    /// Writes a separator, if one is due, and text in the format of the wide `printf`. The text has
    /// the form of the "C" locale. It may be of any length up to the largest `int`.
    ///
    /// The conventions are those of Windows on every platform:
    /// - `%s` and `%c` are wide; `%S`, `%C`, `%hs` and `%hc` are narrow.
    /// - `%I64d` and `%lld` have 64 bits, `%ld` 32, `%hhd` 8.
    /// - Exponents have at least two digits.
    ///
    /// \return the length of the text in characters, without the separator
    /// \throws QrStreamEx::ExWriteError if a `long` does not fit 32 bits or the format ends after a
    ///         '%'
    virtual int formattedWrite(const wchar_t* format, ...);

    /// Reads values in the format of the wide `scanf`. Numbers have the form of the "C" locale. The
    /// first character that does not match stays unread. Does not skip a separator that is due.
    ///
    /// What a conversion stores, on every platform:
    ///
    ///     d u o x p i   an int; with h a short, with l a long, with I64 an int64
    ///     e f g         a float; with l or L a double
    ///     c s [         wide characters; with h, and as C and S, narrow ones
    ///     n             the number of characters read so far, at most the largest int
    ///
    /// A `long` receives 32 bits of the text, even where it is wider. Integers that are too large
    /// keep their low bits.
    ///
    /// **There is no `hh` and no `ll`**: a repeated `h` or `l` counts once. `%hhu` stores two
    /// bytes, past the end of an `unsigned char`, and `%lld` stores a `long` with the low 32 bits
    /// of the number. For the types of `<cstdint>` use these formats:
    /// - 8 bits: none. Read an `int` with `%d`, or an `unsigned int` with `%u`, and convert it.
    /// - 16 bits: `%hd` and `%hu`.
    /// - 32 bits: `%d` and `%u`.
    /// - 64 bits: `%I64d` and `%I64u`, with an `int64` or `unsigned long long`. `std::int64_t` is a
    ///   `long` on Linux and a `long long` on Windows.
    ///
    ///     int64 size = 0;
    ///     unsigned int level = 0;
    ///     if (stream.formattedRead(L"%I64d %u", &size, &level) != 2)
    ///         ...
    ///
    /// \return the number of arguments assigned. The end of input ends the read and does not throw.
    virtual int formattedRead(const wchar_t* format, ...);

    /// The operation of the stream to which a call of the IO belongs. Since 0.2.
    enum class TextKind : unsigned char {
        Other,     ///< Binary data, or an operation of a derived class.
        Value,     ///< A number or a `bool`, by an operator.
        String,    ///< The characters of a string in the text form of `<<` and `>>`.
        Character, ///< The code of a `wchar_t`, which cannot be read back.
        Formatted  ///< Text in a format of the caller, or a number that is read.
    };

    /// Returns what the stream writes or reads at this moment. For an IO that must distinguish
    /// operations that write the same characters, some of which cannot be read back.
    ///
    /// \since 0.2
    TextKind textKind() const { return currentText; }

    /// Reads one whole object through the IO. If its `read` called `postLoad`, that request is
    /// appended to this stream's post-load list, after those of the objects read inside it. The
    /// stream does not notify the list: `transfer` it and call `QrPostLoadList::loadFinished` when
    /// the load is over.
    ///
    /// \param uid  the interface that the object must have, or null; its meaning is up to the IO
    /// \param a    a name for IOs that use one, or null
    /// \param b    a second name, or null
    /// \return a reference to the object
    /// \throws QrStreamEx::ExReadObjectImp if the IO does not read objects
    QrRef<QrCastable> readObject(const QrUid* uid, const wchar_t* a, const wchar_t* b);

    /// Writes one whole object through the IO and returns the stream.
    ///
    /// \throws QrStreamEx::ExWriteObjectImp if the IO does not write objects
    QrStream& operator<<(const QrCastable* obj);

    /// Deleted: any other pointer would be written as a `bool`.
    template <class P>
    requires(!std::is_convertible_v<P*, const QrCastable*>) QrStream& operator<<(P*) = delete;
    template <class C, class M>
    QrStream& operator<<(M C::*) = delete;

  protected:
    /// Takes a reference to the `QrBufferedIO` of `io`.
    ///
    /// \throws QrComponentManagerEx::ExBadCast if `io` is null or has no `QrBufferedIO`
    explicit QrStream(QrCastable* io);

    /// Returns the IO that the stream reads and writes.
    QrBufferedIO& io() const { return *bufferedIO; }

    /// Writes the separator, if one is due. Call it before a text value.
    void writeSeparator();
    /// Skips the separator, if one is due. Call it before a read.
    void skipSeparator();
    /// Ends the line of text, if a separator is due. Call it before binary data.
    void endText();
    /// Reads `length` characters into `value`, white space included.
    ///
    /// \return false if `length` is negative, if the input has fewer characters, or if a NUL, which
    ///         is never consumed, would fill more than 1,048,576 characters
    bool readCharacters(std::wstring& value, int length);

  private:
    template <class T>
    void writeBinary(const T& values, int count);
    template <class T>
    int readBinary(T& values, int count);
    int writeText(const wchar_t* text, int length);
    /// Writes the digits from `begin + 1` to `end`. Puts the separator, if one is due, at `begin`.
    int writeNumber(char* begin, const char* end);
    template <class T>
    bool writeInPlace(T value);
    template <class T>
    bool readInPlace(T& value);
    template <class T>
    QrStream& readTextOf(const wchar_t* format, T& value);
    template <class T>
    QrStream& writeTextOf(const wchar_t* format, T value);
    template <class T>
    QrStream& writeFormatted(const wchar_t* format, T value, TextKind kind = TextKind::Value);
    template <class T>
    QrStream& readFormatted(const wchar_t* format, T& value);

    QrPtr<QrBufferedIO> bufferedIO;
    QrPostLoadList postLoadList;
    /// The request of the object that is being read; null outside `readObject`.
    QrPtr<QrPersistant>* postLoadHolder = nullptr;
    /// The number of characters on the current line of text; at most the largest `int`.
    int column = 0;
    /// Whether a separator is due: set by a text write, never by a read.
    bool separatorPending = false;
    TextKind currentText = TextKind::Other;
};

/// Writes a uid as its four words in order, each an `unsigned int`, and returns the stream.
MZ_COMPONENT_MANAGER_API QrStream& operator<<(QrStream& stream, const QrUid& uid);
/// Reads what `<<` wrote and returns the stream.
///
/// \throws QrStreamEx::ExReadError if the uid is not complete
MZ_COMPONENT_MANAGER_API QrStream& operator>>(QrStream& stream, QrUid& uid);

} // namespace Mz
