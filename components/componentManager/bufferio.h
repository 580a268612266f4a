// SPDX-License-Identifier: BSL-1.0
/// The byte and character layer below streams and importers, and its two implementations on
/// standard streams.
#pragma once

#include "components/componentManager/cast.h"
#include "components/componentManager/export.h"

#include <iosfwd>

namespace Mz {

class QrStream;
struct StandardStreams;

/// The byte and character layer below streams and importers: the buffered IO.
///
/// **Units.** Positions and sizes are in bytes, counts in characters. A size or count below 1 reads
/// and writes nothing, unless a comment says otherwise.
///
/// **Characters.** Narrow text is bytes in the multibyte encoding of the current C locale. Wide
/// text is `wchar_t`. While LC_CTYPE is "C" or "POSIX", byte and character code are equal from 0 to
/// 255, on every platform, and larger codes cannot be written. In any other locale the C library
/// converts. If it calls a sequence invalid or incomplete, further bytes are read, up to four in
/// all, before the sequence is an error.
///
/// **Failures.** The end of input is a result (-1, 0 or a short count), never an exception. A
/// medium that fails throws `QrStreamEx::ExReadError` or `QrStreamEx::ExWriteError`; what was read
/// or written before remains.
///
/// **Implementations.** `QrInBuffer` only reads: its write functions throw `QrStreamEx::ExWrite`.
/// `QrOutBuffer` only writes: its read functions throw `QrStreamEx::ExRead`. Neither transfers
/// whole objects. `QrObjectOutBuffer` and `QrObjectInBuffer` of libMZobjectIO do, and a host may
/// have another class for that.
///
/// Used by one thread at a time. The order of the virtual functions is ABI.
class MZ_COMPONENT_MANAGER_API QrBufferedIO : public QrCastable {
  public:
    using Self = QrBufferedIO;
    static constexpr QrUid uid{0x81C8DF23, 0xA78111D1, 0x988A4445, 0x53540000};

    ~QrBufferedIO() override;

    /// Returns whether callers should not rely on the buffering below. False for both buffers of
    /// this library.
    virtual bool isBufferIgnored() const = 0;

    /// Writes a whole object.
    ///
    /// \param obj  the object; whether it may be null is up to the IO
    /// \param s    the stream on this IO to which the object writes itself
    /// \param a    a name for IOs that use one, or null
    /// \param b    a second name, or null
    /// \throws QrStreamEx::ExWriteObjectImp if the IO does not write objects, like `QrInBuffer` and
    ///         `QrOutBuffer`
    virtual void writeObject(const QrCastable* obj, QrStream& s, const wchar_t* a,
                             const wchar_t* b) = 0;

    /// Reads a whole object.
    ///
    /// \param s   the stream on this IO from which the object reads itself
    /// \param id  the interface that the object must have, or null
    /// \param a   a name as for `writeObject`, or null
    /// \param b   a second name, or null
    /// \return a reference to the object
    /// \throws QrStreamEx::ExReadObjectImp if the IO does not read objects, like `QrInBuffer` and
    ///         `QrOutBuffer`
    virtual QrRef<QrCastable> readObject(QrStream& s, const QrUid* id, const wchar_t* a,
                                         const wchar_t* b) = 0;

    /// Writes `size` bytes from `data`.
    virtual void write(const void* data, int size) = 0;
    /// Writes one byte.
    virtual void write(char c) = 0;

    /// Reads up to `size` bytes into `data`. After a short count the standard stream remains at end
    /// of file, where `tell` returns -1, until the next read of a single byte or character.
    ///
    /// \return the number of bytes read
    virtual int read(void* data, int size) = 0;
    /// Reads one byte.
    ///
    /// \return 0 to 255, or -1 at the end of input
    virtual int read() = 0;

    /// Writes a line end: the single byte 10, on every platform. Does not check for failures.
    virtual void writeEol() = 0;
    /// Writes a space: the byte 32. Does not check for failures.
    virtual void writeSpace() = 0;

    /// Writes `count` wide characters.
    ///
    /// \return `count`
    /// \throws QrStreamEx::ExWriteError if a character cannot be converted; those before it are
    ///         written
    virtual int writeChar(const wchar_t* s, int count) = 0;
    /// Writes `size` bytes of multibyte text.
    ///
    /// \return the number of characters in it; a NUL counts as one
    /// \throws QrStreamEx::ExWriteError if the bytes are not valid text; none is written
    virtual int writeChar(const char* s, int size) = 0;
    /// Writes one wide character.
    ///
    /// \throws QrStreamEx::ExWriteError if it cannot be converted
    virtual void writeChar(wchar_t c) = 0;
    /// Writes one byte that is a whole character.
    ///
    /// \throws QrStreamEx::ExWriteError if it is not
    virtual void writeChar(char c) = 0;

    /// Skips at most `count` white-space characters. A carriage return with a line feed counts as
    /// one. A carriage return without a line feed is consumed and ends the skip.
    virtual void skipWhiteSpace(int count) = 0;

    /// Reads wide characters into `buf`, at most the smaller of `size` and `count`. Appends no
    /// terminator. A NUL byte fills the rest of the request with L'\0' and stays unread.
    ///
    /// \return the number of characters stored
    /// \throws QrStreamEx::ExReadError if four bytes form no character
    virtual int readChar(wchar_t* buf, int size, int count) = 0;
    /// Reads whole multibyte characters into the `size` bytes at `buf`. Appends no terminator.
    /// Stops before a NUL, which stays unread. The bytes of a character that did not fit stay
    /// unread too.
    ///
    /// \param count  the largest number of characters; a negative one sets no limit
    /// \return the number of *bytes* that the characters take. The bytes of `buf` after them are
    ///         undefined.
    /// \throws QrStreamEx::ExReadError if four bytes form no character
    virtual int readChar(char* buf, int size, int count) = 0;
    /// Reads one wide character, by `readChar(&c, 1, 1)`.
    ///
    /// \return 1, or 0 at the end of input
    virtual int readChar(wchar_t& c) = 0;
    /// Reads one byte, which need not be a whole character.
    ///
    /// \return 1, or 0 at the end of input
    virtual int readChar(char& c) = 0;

    /// Puts a wide character back, to be read next.
    ///
    /// \throws QrStreamEx::ExReadError if it cannot be converted, or the standard stream does not
    ///         take it back
    virtual void ungetc(wchar_t c) = 0;
    /// Puts a byte back, to be read next. Does not check for failures.
    virtual void ungetc(char c) = 0;

    /// Returns whether `tell` would return a position now.
    virtual bool canSeek() const = 0;
    /// Moves to another position. `seek(0, 1)` only calls `tell` and never throws.
    ///
    /// \param offset  the distance from `origin` in bytes
    /// \param origin  0 for the beginning, 1 for the current position, 2 for the end
    /// \return the new position
    /// \throws QrStreamEx::ExReadError on input, QrStreamEx::ExWriteError on output, if the
    ///         position cannot be reached or `origin` is another number
    virtual int64 seek(int64 offset, int origin) = 0;
    /// Returns the current position in bytes, or -1 if there is none or the standard stream has
    /// failed. Never throws.
    virtual int64 tell() const = 0;

  private:
    /// Has no effect. Anchors the vtable in this library.
    virtual void forceVtblInstantiation();
};

/// The input buffer: reads from a `std::istream`.
///
/// The caller owns the stream and keeps it alive; the buffer neither opens nor closes it. All state
/// is the stream's. The buffer is not counted: references do not keep it alive. It is usually a
/// local variable for one operation.
///
/// The stream may have an exception mask, `unitbuf`, or a tied stream:
/// - The exceptions of the mask do not pass through. The flags of the stream decide, as without a
///   mask, also if the stream's buffer throws in a flush.
/// - A tied stream is flushed before each operation. If that fails, only the tied stream records
///   the failure, and the operation is carried out.
/// - During an operation the stream has no mask, tie or `unitbuf`. They are restored before the
///   operation returns or throws.
class MZ_COMPONENT_MANAGER_API QrInBuffer
    : public QrCastImpl<QrInBuffer, QrBufferedIO, const QrInBuffer&> {
  public:
    /// Stores the pointer. It must not be null in any later operation on the stream.
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

    /// Returns how many bytes can be read from what the stream's buffer holds, without asking the
    /// medium. Negative if a read may do more than that: the class of the buffer is not exactly one
    /// of the standard library, or the stream is not good, is tied or has `unitbuf`. Reads nothing.
    ///
    /// \since 0.2
    int64 heldBytes() const;

  private:
    friend struct StandardStreams;

    std::istream* in;
};

/// The output buffer: writes to a `std::ostream`, with the same rules as `QrInBuffer`.
class MZ_COMPONENT_MANAGER_API QrOutBuffer
    : public QrCastImpl<QrOutBuffer, QrBufferedIO, const QrOutBuffer&> {
  public:
    /// Stores the pointer. It must not be null in any later operation on the stream.
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
