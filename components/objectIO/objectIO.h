// SPDX-License-Identifier: BSL-1.0
/// Buffered IO for whole objects, which `QrInBuffer` and `QrOutBuffer` do not transfer.
///
/// Put one of these classes between a stream and its buffer to use `stream << object` and
/// `stream.readObject(…)`. Saving:
///
///     std::ofstream file("scene.bin", std::ios::binary);
///     QrOutBuffer bytes(&file);
///     QrObjectOutBuffer objects(&bytes);
///     QrBinaryStream stream(&objects);
///     stream << scene.get();
///
/// Loading, with the component manager initialised:
///
///     std::ifstream file("scene.bin", std::ios::binary);
///     QrInBuffer bytes(&file);
///     QrObjectInBuffer objects(&bytes);
///     QrBinaryStream stream(&objects);
///     QrRef<QrCastable> scene = stream.readObject(&Scene::uid, nullptr, nullptr);
///     QrPostLoadList list;
///     stream.transfer(list);
///     list.loadFinished();
///
/// **Identity.** An object is stored with the identity and version of its class (`QrPersistant`).
/// The component manager's builder of that identity makes it again. An object that is reached twice
/// is stored once and read as one object. Cycles and null are allowed. Other objects may receive an
/// object that is still being read, so resolve links in `loadFinished`, not in `read`.
///
/// **Values.** Every kind of stream carries numbers, `bool`, objects, and strings written with
/// `QrWriteExactText`. Inside an object, a value that would not be read back exactly throws
/// `QrStreamEx::ExWriteError` when it is written:
/// - in text, a string that is not empty, an array of `wchar_t`, an infinity or a NaN;
/// - in every form, a single `wchar_t`;
/// - in strings and formatted text, L'\0' and a character that the locale lacks. Read strings in
///   the locale in which they were written.
///
/// **Formatted text.** `formattedWrite` needs no separator after its text: the IO writes a blank
/// before the next value. Formatted text directly after formatted text, without white space between
/// them, throws `ExWriteError`, as do the words "inf" and "nan" in it. None of this applies to
/// binary streams: there the format itself must end its text.
///
/// **Streams of both forms.** A stream of a class derived from `QrStream` itself, neither text nor
/// binary, writes single values as text and arrays as binary data. Inside an object the IO writes a
/// line end between the two and skips it when it reads. Formatted text before binary data must not
/// end in white space.
#pragma once

#include "components/componentManager/stream.h"
#include "components/objectIO/export.h"

#include <cstdint>
#include <memory>
#include <string>

namespace Mz {

struct ObjectInputRelay;
struct ObjectOutputRelay;

/// The largest depth to which objects may be nested in one another. More throws, to prevent an
/// overflow of the stack. Write a long chain as a list of its elements.
///
/// The limit applies to reading and writing, not to references between objects: siblings may form a
/// chain of any length, each with a reference to the one before. Releasing such a chain at its
/// unreferenced end recurses, one destructor inside the other, and a long one overflows the stack.
/// The IO objects release their objects one by one, also after a failure. A host that releases the
/// objects after them must unlink long chains in a loop.
inline constexpr int QrMaximumObjectDepth = 500;

/// A buffered IO that forwards every call to another one, to which it owns a reference. A base for
/// an IO that changes single operations.
class MZ_OBJECT_IO_API QrForwardingIO : public QrBufferedIO {
  public:
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

  protected:
    /// Takes a reference to the `QrBufferedIO` of `io`.
    ///
    /// \throws QrComponentManagerEx::ExBadCast if `io` is null or has no `QrBufferedIO`
    explicit QrForwardingIO(QrCastable* io);
    ~QrForwardingIO() override;

    /// Returns the IO that receives the calls.
    QrBufferedIO& inner() const { return *target; }

  private:
    QrPtr<QrBufferedIO> target;
};

/// The IO that writes whole objects.
///
/// Not counted: the caller keeps it alive as long as the stream on it.
///
/// Owns a reference to every object that it has written, until it is destroyed: objects are
/// identified by address, which must not be reused meanwhile. It releases them in the reverse of
/// the order in which they were complete.
///
/// After a failure inside an object, every further write of an object throws. The data before that
/// object is complete, the object is not. An object that is rejected before any of it was written
/// does not change this IO.
class MZ_OBJECT_IO_API QrObjectOutBuffer
    : public QrCastImpl<QrObjectOutBuffer, QrForwardingIO, const QrObjectOutBuffer&> {
  public:
    /// Takes a reference to the `QrBufferedIO` of `io`, which receives the bytes and characters.
    ///
    /// \throws QrComponentManagerEx::ExBadCast if `io` is null or has no `QrBufferedIO`
    explicit QrObjectOutBuffer(QrCastable* io);
    ~QrObjectOutBuffer() override;

    /// Writes an object, or null. The names are ignored. Exceptions of the object's `write` pass
    /// through.
    ///
    /// \throws QrStreamEx::ExWriteObject, with the position, if the object or one inside it is no
    ///         `QrPersistant` or is nested too deeply, or if an earlier object failed
    void writeObject(const QrCastable* obj, QrStream& s, const wchar_t* a,
                     const wchar_t* b) override;

    /// Writes characters. Inside an object, writes a blank between formatted text and a value.
    ///
    /// \return `count`
    /// \throws QrStreamEx::ExWriteError if the text cannot be read back
    int writeChar(const wchar_t* s, int count) override;

    using QrForwardingIO::writeChar;

    /// Writes bytes. Inside an object, on a stream of both forms, writes a line end between text
    /// and the bytes.
    ///
    /// \throws QrStreamEx::ExWriteError if formatted text before them ends in white space
    void write(const void* data, int size) override;
    using QrForwardingIO::write;
    void writeEol() override;
    void writeSpace() override;

  private:
    friend struct ObjectOutputRelay;

    void writeRecord(QrStream& s, std::uint32_t number, QrPersistant* object);

    struct State;
    std::unique_ptr<State> state;
};

/// The IO that reads whole objects.
///
/// Not counted: the caller keeps it alive as long as the stream on it. Owns a reference to every
/// object that it has read, until it is destroyed. It releases them in the reverse of the order in
/// which they were complete.
///
/// While an object is read, nothing but this IO may read from the inner one: the positions in the
/// reasons of exceptions are counted from the beginning of the outermost object.
class MZ_OBJECT_IO_API QrObjectInBuffer
    : public QrCastImpl<QrObjectInBuffer, QrForwardingIO, const QrObjectInBuffer&> {
  public:
    /// Takes a reference to the `QrBufferedIO` of `io`, which supplies the bytes and characters.
    ///
    /// \throws QrComponentManagerEx::ExBadCast if `io` is null or has no `QrBufferedIO`
    explicit QrObjectInBuffer(QrCastable* io);
    ~QrObjectInBuffer() override;

    /// Reads an object. Other exceptions of the object's code pass through unchanged.
    ///
    /// After any exception, every further read of an object throws. Do not notify the post-load
    /// list of the stream then: it may contain objects of the load that failed.
    ///
    /// \param s   the stream on this IO
    /// \param id  the interface that the object must have, itself or by a translation, or null
    /// \return the object as its principal interface, or null if null was written
    /// \throws QrStreamEx::ExReadObject if
    ///         - no object begins here,
    ///         - no builder makes its class, or makes objects of another class or version,
    ///         - the data ends or fails inside the object, or a cast in it fails,
    ///         - the object reads less or more than was written,
    ///         - objects are nested too deeply,
    ///         - the object does not have the interface `id`, or
    ///         - an earlier object failed.
    ///         The reason names the position and the fault.
    QrRef<QrCastable> readObject(QrStream& s, const QrUid* id, const wchar_t* a,
                                 const wchar_t* b) override;

    /// Reads characters, as `QrBufferedIO`.
    ///
    /// \throws QrStreamEx::ExReadError for a string with a NUL, a string in text form that is not
    ///         empty, or a `bool` in text form that is neither 0 nor 1
    int readChar(wchar_t* buf, int size, int count) override;
    int readChar(wchar_t& c) override;
    int readChar(char* buf, int size, int count) override;
    int readChar(char& c) override;

    /// Reads bytes. On a stream of both forms, skips the line end between text and the bytes.
    ///
    /// \throws QrStreamEx::ExReadError if the line end is missing, or on a text stream, where only
    ///         an array of `wchar_t` is read as bytes and its written form is text
    int read(void* data, int size) override;
    int read() override;
    void skipWhiteSpace(int count) override;
    void ungetc(wchar_t c) override;
    void ungetc(char c) override;
    int64 seek(int64 offset, int origin) override;

  private:
    friend struct ObjectInputRelay;

    QrRef<QrCastable> readRecord(QrStream& s, int64 begin);
    QrRef<QrCastable> readNewObject(QrStream& s, std::uint32_t number, int64 begin);

    struct State;
    std::unique_ptr<State> state;
};

/// Writes `text` in a form that every kind of stream reads back exactly, in every locale: the
/// number of its characters and their codes, each an `unsigned int`.
///
/// \throws QrStreamEx::ExWriteError if the medium fails or the text has more characters than an
///         `unsigned int` can count
MZ_OBJECT_IO_API void QrWriteExactText(QrStream& stream, const std::wstring& text);

/// Reads what `QrWriteExactText` wrote.
///
/// \return the text
/// \throws QrStreamEx::ExReadError if it is not complete, or has a character that the platform's
///         `wchar_t` cannot represent
MZ_OBJECT_IO_API std::wstring QrReadExactText(QrStream& stream);

} // namespace Mz
