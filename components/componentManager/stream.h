/// Persistence streams: typed values over a `QrBufferedIO`, as text or as binary data.
#pragma once

#include "components/componentManager/bufferio.h"
#include "components/componentManager/export.h"
#include "components/componentManager/persistant.h"

#include <string>
#include <type_traits>

namespace Mz {

/// What every persistent object writes itself to and reads itself from.
///
/// Each basic type has a single-value operator (`<<`, `>>`) and a counted operation (`write`,
/// `read`), where the reference names the first of `count` values that stand one after the other.
/// This base writes single values as text and counted ones as binary data; `QrTextStream` and
/// `QrBinaryStream` each send one half to the other, so that what they write is of one kind.
///
/// **Text.** Values are separated by single blanks, or a line end once a line has passed 70
/// characters; the separator is written before the next value. Numbers look as in the "C" locale,
/// whatever the process's locale is. `float` has 9 significant digits and `double` 16, characters
/// are written as their codes. Three forms have edges of their own, which are kept for the files
/// that have them:
/// - `bool` is one character, "0" or "1", *without* a separator behind it;
/// - a string is its length, a separator and its characters as they stand. Reading does not skip
///   that separator, so a string read from text starts with it, and its last character stays
///   unread. Use the binary form for strings;
/// - `wchar_t` is written as its code and can never be read: `operator>>(wchar_t&)` always raises
///   `QrStreamEx::ExReadError`.
///
/// **Binary.** Values are big-endian: `bool` and the `char` types 1 byte, `short` and `wchar_t` 2,
/// `int`, `long` and `float` 4, `int64` and `double` 8. A string is its length in characters (4
/// bytes) and the characters as the IO writes wide characters.
///
/// The widths are the same on every platform: a `long` or `wchar_t` that does not fit raises
/// `QrStreamEx::ExWriteError`. Counts and lengths read from a stream are never trusted: memory
/// grows with the data that arrives.
///
/// **Failures.** A single value that cannot be read raises `QrStreamEx::ExReadError`; counted reads
/// return how many whole values came. A failing medium raises what the IO raises. What was read or
/// written before a failure stays so.
///
/// A stream is used by one thread at a time. The order of the virtual operations is fixed.
class MZ_COMPONENT_MANAGER_API QrStream {
  public:
    /// Drops the objects that are still to be told, without telling them, then the IO.
    virtual ~QrStream();
    QrStream(const QrStream&) = delete;
    QrStream& operator=(const QrStream&) = delete;

    virtual bool isTextStream() const;
    virtual bool isBinaryStream() const;

    /// To be called by an object's reading code: asks for `obj` to be told when the load is over.
    /// One object is remembered for each object that is being read; a second call replaces it. Must
    /// not be called outside `readObject`, where it does nothing.
    virtual void postLoad(QrPersistant* obj);

    /// Moves the objects that are still to be told to `target`, as `QrPostLoadList::transfer` does.
    virtual void transfer(QrPostLoadList& target);

    /// The number of the current line, from 1, for messages: counted from the beginning of the
    /// input, which must be able to seek. 1 when the position is not known.
    virtual int computeLineNb();

    /// Writes `count` values; a count below 1 writes nothing.
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

    /// Reads up to `count` values and returns how many whole ones came.
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

    /// Writes text formatted in the manner of the wide `printf`, in the "C" locale, after the
    /// separator that is due, and returns its length. The output may be of any length.
    ///
    /// The conventions are those of Windows on every platform: `%s` and `%c` take wide text, `%S`,
    /// `%C`, `%hs` and `%hc` narrow text; `%I64d` is 64 bits wide, `%ld` 32, and a `long` that does
    /// not fit raises `QrStreamEx::ExWriteError`. Exponents have at least two digits.
    virtual int formattedWrite(const wchar_t* format, ...);

    /// Reads by a format in the manner of the wide `scanf`, in the "C" locale, and returns how many
    /// arguments were assigned; the end of input only ends the reading. The first character that
    /// does not match stays unread. No pending separator is skipped.
    ///
    /// `d u o x p i` store an `int`, with `h` a `short`, with `l` a `long` (of 32 bits in the
    /// text), with `I64` an `int64`; `e f g` a `float`, with `l` a `double`; `c s [` wide
    /// characters, with `h`, and as `C` and `S`, narrow ones. `n` stores the number of characters
    /// read so far, at most the largest `int`.
    virtual int formattedRead(const wchar_t* format, ...);

    /// What a call of the IO belongs to.
    enum class TextKind : unsigned char {
        Other,     ///< Binary data, or whatever a derived class does by itself.
        Value,     ///< A number or a `bool`, by an operator.
        String,    ///< The characters of a string in the text form of `<<` and `>>`.
        Character, ///< The code of a `wchar_t`, which is never read back.
        Formatted  ///< Text by a format of the caller, or a number that is read.
    };

    /// Returns what the stream writes or reads at this moment. For an IO that must know it: the
    /// same characters may come from several operations, of which some cannot be read back.
    TextKind textKind() const { return currentText; }

    /// Reads one whole object through the IO, which knows what `uid`, `a` and `b` mean to it (the
    /// interface wanted, and two names; each may be null). An object that asked to be told when the
    /// load is over joins this stream's list, after those that were read inside it. The list is
    /// told by nobody here: `transfer` it and call `loadFinished` when the load is over.
    QrRef<QrCastable> readObject(const QrUid* uid, const wchar_t* a, const wchar_t* b);

    /// Writes one whole object through the IO.
    QrStream& operator<<(const QrCastable* obj);

    /// Any other pointer would be written as a `bool`.
    template <class P>
    requires(!std::is_convertible_v<P*, const QrCastable*>) QrStream& operator<<(P*) = delete;
    template <class C, class M>
    QrStream& operator<<(M C::*) = delete;

  protected:
    /// Takes a reference on the `QrBufferedIO` of `io`. Throws `QrComponentManagerEx::ExBadCast`
    /// when it has none or is null.
    explicit QrStream(QrCastable* io);

    QrBufferedIO& io() const { return *bufferedIO; }

    /// Writes the separator that is due, if one is: before a text value.
    void writeSeparator();
    /// Skips the separator that is due, if one is: before a read.
    void skipSeparator();
    /// Ends the line of text, if a separator is due: before binary data.
    void endText();
    /// Reads `length` characters, as they stand, into `value`. False when `length` is negative,
    /// fewer come, or nothing but a NUL, which is never consumed, fills more than 1 MiB.
    bool readCharacters(std::wstring& value, int length);

  private:
    template <class T>
    void writeBinary(const T& values, int count);
    template <class T>
    int readBinary(T& values, int count);
    int writeText(const wchar_t* text, int length);
    /// Writes the digits that stand from `begin + 1` to `end`; the separator may be put at `begin`.
    int writeNumber(char* begin, const char* end);
    template <class T>
    QrStream& writeFormatted(const wchar_t* format, T value, TextKind kind = TextKind::Value);
    template <class T>
    QrStream& readFormatted(const wchar_t* format, T& value);

    QrPtr<QrBufferedIO> bufferedIO;
    QrPostLoadList postLoadList;
    /// Where the object that is being read is remembered, if it asks for it.
    QrPtr<QrPersistant>* postLoadHolder = nullptr;
    /// How many characters the current line of text has; at most the largest `int`.
    int column = 0;
    bool separatorPending = false;
    TextKind currentText = TextKind::Other;
};

/// An identifier is its four words in order, each as an `unsigned int`.
MZ_COMPONENT_MANAGER_API QrStream& operator<<(QrStream& stream, const QrUid& uid);
MZ_COMPONENT_MANAGER_API QrStream& operator>>(QrStream& stream, QrUid& uid);

} // namespace Mz
