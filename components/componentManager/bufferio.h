/// Bytes and characters over standard streams: what every persistent stream and every importer
/// reads from and writes to.
#pragma once

#include "components/componentManager/cast.h"
#include "components/componentManager/export.h"

#include <iosfwd>

namespace Mz {

class QrStream;
struct StandardStreams;

/// The byte and character layer under streams and importers.
///
/// Narrow text is bytes in the multibyte encoding of the current C locale, wide text is `wchar_t`.
/// While LC_CTYPE is "C" or "POSIX", byte and character code are one and the same from 0 to 255, on
/// every platform, and larger codes cannot be written. In any other locale the C library converts;
/// a sequence that it rejects or calls incomplete is given further bytes, up to four in all, before
/// it is an error.
///
/// The two implementations here, `QrInBuffer` and `QrOutBuffer`, work in one direction and refuse
/// the other: reading on output raises `QrStreamEx::ExRead`, writing on input
/// `QrStreamEx::ExWrite`. They hand whole objects to nobody: `writeObject` and `readObject` raise
/// `ExWriteObjectImp` and `ExReadObjectImp`. Hosts that store objects bring an IO of their own.
///
/// End of input is a result (-1, 0, a short count), never an exception. A failure of the medium
/// raises `QrStreamEx::ExReadError` or `QrStreamEx::ExWriteError`; what was read or written before
/// it stays so. Counts and sizes below 1 read and write nothing, where nothing else is said.
///
/// An IO is used by one thread at a time. All positions and sizes are in bytes, all counts in
/// characters. The order of the virtual operations is fixed.
class MZ_COMPONENT_MANAGER_API QrBufferedIO : public QrCastable {
  public:
    using Self = QrBufferedIO;
    static constexpr QrUid uid{0x81C8DF23, 0xA78111D1, 0x988A4445, 0x53540000};

    ~QrBufferedIO() override;

    /// Whether users should not rely on the buffering below. False in this library.
    virtual bool isBufferIgnored() const = 0;

    /// Writes a whole object for the stream `s`, which works on this IO. `a` and `b` are two names
    /// that IOs which know objects may use; both may be null. No reference is kept on `obj`.
    virtual void writeObject(const QrCastable* obj, QrStream& s, const wchar_t* a,
                             const wchar_t* b) = 0;

    /// Reads a whole object for the stream `s`. `id` names the interface that is wanted, `a` and
    /// `b` are as for `writeObject`; each may be null.
    virtual QrRef<QrCastable> readObject(QrStream& s, const QrUid* id, const wchar_t* a,
                                         const wchar_t* b) = 0;

    /// Writes `size` bytes from `data`.
    virtual void write(const void* data, int size) = 0;
    /// Writes one byte.
    virtual void write(char c) = 0;

    /// Reads up to `size` bytes into `data` and returns how many came. After a short count the
    /// standard stream keeps its end-of-file state, so that `tell` answers -1, until the next read
    /// of a single byte or character clears it.
    virtual int read(void* data, int size) = 0;
    /// Reads one byte: 0 to 255, or -1 at the end of input.
    virtual int read() = 0;

    /// Writes a line end, the single byte 10 on every platform. Failures are not noticed here.
    virtual void writeEol() = 0;
    /// Writes a space, the byte 32. Failures are not noticed here.
    virtual void writeSpace() = 0;

    /// Writes `count` wide characters and returns `count`. A character that cannot be converted
    /// raises `ExWriteError`; those before it are written.
    virtual int writeChar(const wchar_t* s, int count) = 0;
    /// Writes `size` bytes of multibyte text and returns how many characters they hold; a NUL is a
    /// character too. Bytes that are no text raise `ExWriteError`, and nothing is written.
    virtual int writeChar(const char* s, int size) = 0;
    /// Writes one wide character. `ExWriteError` when it cannot be converted.
    virtual void writeChar(wchar_t c) = 0;
    /// Writes one byte that is a character by itself. `ExWriteError` when it is not.
    virtual void writeChar(char c) = 0;

    /// Skips at most `count` characters of white space. A carriage return and line feed count as
    /// one; a carriage return without a line feed is consumed and ends the skip.
    virtual void skipWhiteSpace(int count) = 0;

    /// Reads up to the smaller of `size` and `count` wide characters into `buf`, without a
    /// terminator, and returns how many. A NUL byte fills all that is still wanted with L'\0' and
    /// stays unread. Four bytes that form no character raise `ExReadError`.
    virtual int readChar(wchar_t* buf, int size, int count) = 0;
    /// Reads up to `count` whole multibyte characters into the `size` bytes at `buf`, without a
    /// terminator, and returns how many *bytes* they take; a negative `count` sets no limit. Stops
    /// before a NUL, which stays unread, as do the bytes of a character that did not fit. The bytes
    /// of `buf` behind the result are undefined.
    virtual int readChar(char* buf, int size, int count) = 0;
    /// Reads one wide character, as `readChar(&c, 1, 1)` does, and returns 1, or 0 at the end.
    virtual int readChar(wchar_t& c) = 0;
    /// Reads one byte, be it a whole character or not, and returns 1, or 0 at the end.
    virtual int readChar(char& c) = 0;

    /// Puts a wide character back, to be read next. `ExReadError` when it cannot be converted or
    /// the standard stream fails for good.
    virtual void ungetc(wchar_t c) = 0;
    /// Puts a byte back, to be read next. Failures are not noticed here.
    virtual void ungetc(char c) = 0;

    /// Whether `tell` has an answer at this moment.
    virtual bool canSeek() const = 0;
    /// Moves to `offset` bytes from `origin` (0 the beginning, 1 the current position, 2 the end)
    /// and returns the new position. `seek(0, 1)` is `tell()` and cannot fail; otherwise a position
    /// that cannot be reached, or another origin, raises `ExReadError` or `ExWriteError`.
    virtual int64 seek(int64 offset, int origin) = 0;
    /// The current position, or -1 when there is none or the stream has failed. Never throws.
    virtual int64 tell() const = 0;

  private:
    virtual void forceVtblInstantiation();
};

/// Reads from a `std::istream` that the caller keeps alive; the buffer neither opens nor closes it.
///
/// Uncounted, and usually a local variable around one piece of work: references to it keep nothing
/// alive. All state is the stream's.
///
/// The stream may have an exception mask: what the mask throws does not come through, and the flags
/// decide as for any other stream. This holds under `unitbuf` too, and where the stream's buffer
/// throws while it is flushed. A stream that is tied to another one flushes that one before each
/// operation, as ever; if the flush fails, the tied stream gets the flag, and the operation is done
/// all the same. During an operation the stream has neither mask, tie nor `unitbuf`; each is back
/// when the operation returns or throws.
class MZ_COMPONENT_MANAGER_API QrInBuffer
    : public QrCastImpl<QrInBuffer, QrBufferedIO, const QrInBuffer&> {
  public:
    /// Only stores the pointer, which must not be null when anything is read.
    explicit QrInBuffer(std::istream* in);
    ~QrInBuffer() override;

    bool isBufferIgnored() const override;
    void writeObject(const QrCastable* obj, QrStream& s, const wchar_t* a,
                     const wchar_t* b) override;
    QrRef<QrCastable> readObject(QrStream& s, const QrUid* id, const wchar_t* a,
                                 const wchar_t* b) override;
    void write(const void* data, int size) override;
    void write(char c) override;
    int read(void* data, int size) override;
    int read() override;
    void writeEol() override;
    void writeSpace() override;
    int writeChar(const wchar_t* s, int count) override;
    int writeChar(const char* s, int size) override;
    void writeChar(wchar_t c) override;
    void writeChar(char c) override;
    void skipWhiteSpace(int count) override;
    int readChar(wchar_t* buf, int size, int count) override;
    int readChar(char* buf, int size, int count) override;
    int readChar(wchar_t& c) override;
    int readChar(char& c) override;
    void ungetc(wchar_t c) override;
    void ungetc(char c) override;
    bool canSeek() const override;
    int64 seek(int64 offset, int origin) override;
    int64 tell() const override;

  private:
    friend struct StandardStreams;

    std::istream* in;
};

/// Writes to a `std::ostream`, with the same rules as `QrInBuffer`.
class MZ_COMPONENT_MANAGER_API QrOutBuffer
    : public QrCastImpl<QrOutBuffer, QrBufferedIO, const QrOutBuffer&> {
  public:
    /// Only stores the pointer, which must not be null when anything is written.
    explicit QrOutBuffer(std::ostream* out);
    ~QrOutBuffer() override;

    bool isBufferIgnored() const override;
    void writeObject(const QrCastable* obj, QrStream& s, const wchar_t* a,
                     const wchar_t* b) override;
    QrRef<QrCastable> readObject(QrStream& s, const QrUid* id, const wchar_t* a,
                                 const wchar_t* b) override;
    void write(const void* data, int size) override;
    void write(char c) override;
    int read(void* data, int size) override;
    int read() override;
    void writeEol() override;
    void writeSpace() override;
    int writeChar(const wchar_t* s, int count) override;
    int writeChar(const char* s, int size) override;
    void writeChar(wchar_t c) override;
    void writeChar(char c) override;
    void skipWhiteSpace(int count) override;
    int readChar(wchar_t* buf, int size, int count) override;
    int readChar(char* buf, int size, int count) override;
    int readChar(wchar_t& c) override;
    int readChar(char& c) override;
    void ungetc(wchar_t c) override;
    void ungetc(char c) override;
    bool canSeek() const override;
    int64 seek(int64 offset, int origin) override;
    int64 tell() const override;

  private:
    friend struct StandardStreams;

    std::ostream* out;
};

} // namespace Mz
