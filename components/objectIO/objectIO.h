/// Whole objects on streams: what the library's own buffers refuse to do.
///
/// Put one of these between a stream and the buffer under it, and `stream << object` and
/// `stream.readObject(…)` work. Saving:
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
/// An object is stored with the identity and version of its class (`QrPersistant`) and made again
/// by the component manager's builder of that identity. An object that is reached twice is stored
/// once and comes back as one; cycles and null are fine. An object that is still being read may
/// already be handed to others, so resolve links in `loadFinished`, not while reading.
///
/// **What comes back.** Every kind of stream carries numbers, `bool`, objects, and strings written
/// with `QrWriteExactText`. Inside an object, what would not be read back as it was raises
/// `QrStreamEx::ExWriteError` when it is written:
/// - in text, a string that is not empty, an array of `wchar_t`, infinities and NaNs;
/// - everywhere, a single `wchar_t`;
/// - a character without a form in the locale, and L'\0', in strings and formatted text. Read
///   strings in the locale in which they were written.
///
/// **Formatted text.** `formattedWrite` needs no separator after its text: where a value follows,
/// the IO writes a blank. Formatted text directly after formatted text, without white space between
/// them, and the words "inf" and "nan" in it are refused. On a binary stream nothing of this is
/// done: there the format itself must end what it writes.
///
/// **Streams of both forms.** A stream of a class derived from `QrStream` itself, neither text nor
/// binary, writes single values as text and counted ones as binary data. Inside an object the IO
/// puts a line end between the two and skips it when it reads; formatted text before binary data
/// must not end in white space.
#pragma once

#include "components/componentManager/stream.h"
#include "components/objectIO/export.h"

#include <cstdint>
#include <memory>
#include <string>

namespace Mz {

/// Objects may be nested in one another to this depth. More is an error, where it would else be an
/// overflow of the stack; long chains are written as a list of their elements.
///
/// The depth bounds reading and writing. It does not bound how objects hold one another: siblings
/// may form a chain of any length, each holding the one before. A chain that is dropped at its
/// unheld end is freed by recursion, one destructor inside the other, and a long one overflows the
/// stack. The IO objects here free what they hold one by one, also after a failure; a host that
/// drops the graph after them must unlink long chains in a loop.
inline constexpr int QrMaximumObjectDepth = 500;

/// An IO that leaves everything to another one, on which it holds a reference.
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
    /// Throws `QrComponentManagerEx::ExBadCast` when `io` is null or no `QrBufferedIO`.
    explicit QrForwardingIO(QrCastable* io);
    ~QrForwardingIO() override;

    QrBufferedIO& inner() const { return *target; }

  private:
    QrPtr<QrBufferedIO> target;
};

/// Writes whole objects. Not counted; lives as long as the stream over it needs it.
///
/// Holds a reference on every object that was written, until it is destroyed: what was stored is
/// known by its address, which must not pass to another object meanwhile. References are dropped in
/// the reverse of the order in which the objects were complete.
///
/// After a failure inside an object nothing more can be written through this IO: what came before
/// is complete, the object is not. An object that is refused before anything of it was written
/// leaves this IO as it was.
class MZ_OBJECT_IO_API QrObjectOutBuffer
    : public QrCastImpl<QrObjectOutBuffer, QrForwardingIO, const QrObjectOutBuffer&> {
  public:
    explicit QrObjectOutBuffer(QrCastable* io);
    ~QrObjectOutBuffer() override;

    /// Raises `QrStreamEx::ExWriteObject`, with the position, when the object (or one in it) is no
    /// `QrPersistant`, is nested too deeply, or an earlier object failed; and whatever the object's
    /// own writing raises.
    void writeObject(const QrCastable* obj, QrStream& s, const wchar_t* a,
                     const wchar_t* b) override;

    /// Raises `QrStreamEx::ExWriteError` for text that cannot be read back. Inside an object, ends
    /// formatted text with a blank before the next value.
    int writeChar(const wchar_t* s, int count) override;
    using QrForwardingIO::writeChar;

    /// Inside an object on a stream that is neither text nor binary throughout, begins on a new
    /// line after text.
    void write(const void* data, int size) override;
    using QrForwardingIO::write;
    void writeEol() override;
    void writeSpace() override;

  private:
    void writeRecord(QrStream& s, std::uint32_t number, QrPersistant* object);

    struct State;
    std::unique_ptr<State> state;
};

/// Reads whole objects. Not counted; lives as long as the stream over it needs it. Holds a
/// reference on every object that was read, until it is destroyed; references are dropped in the
/// reverse of the order in which the objects were complete.
class MZ_OBJECT_IO_API QrObjectInBuffer
    : public QrCastImpl<QrObjectInBuffer, QrForwardingIO, const QrObjectInBuffer&> {
  public:
    explicit QrObjectInBuffer(QrCastable* io);
    ~QrObjectInBuffer() override;

    /// The object as its principal interface; null when null was written. When `id` is given, the
    /// object answers for it, by itself or through a translation.
    ///
    /// Raises `QrStreamEx::ExReadObject`, whose reason names the position and what is wrong there:
    /// no object begins here, a class that no builder makes, an object of another class or version,
    /// data that ends or fails inside an object, a bad cast in it, an object that read less or more
    /// than was written, objects nested too deeply, an object without the interface wanted. What
    /// else an object's own code throws passes through unchanged. After either, nothing more can be
    /// read through this IO, and what the stream has for `transfer` is of no use: objects of the
    /// load that failed may be among it.
    QrRef<QrCastable> readObject(QrStream& s, const QrUid* id, const wchar_t* a,
                                 const wchar_t* b) override;

    /// Raises `QrStreamEx::ExReadError` for a string in the text form of a stream, or with a NUL.
    int readChar(wchar_t* buf, int size, int count) override;
    int readChar(wchar_t& c) override;
    using QrForwardingIO::readChar;

    /// Raises `QrStreamEx::ExReadError` for an array of `wchar_t` in the text form of a stream,
    /// which has none. Skips the line end that a writer puts between text and binary data.
    int read(void* data, int size) override;
    using QrForwardingIO::read;

  private:
    QrRef<QrCastable> readRecord(QrStream& s, int64 position);
    QrRef<QrCastable> readNewObject(QrStream& s, std::uint32_t number, int64 position);

    struct State;
    std::unique_ptr<State> state;
};

/// Writes `text` in a form that every kind of stream gives back exactly, in every locale: its
/// length, then the code of each character, all as `unsigned int`.
MZ_OBJECT_IO_API void QrWriteExactText(QrStream& stream, const std::wstring& text);

/// Reads what `QrWriteExactText` wrote. `QrStreamEx::ExReadError` when it is cut, or has a
/// character that this platform's `wchar_t` cannot hold.
MZ_OBJECT_IO_API std::wstring QrReadExactText(QrStream& stream);

} // namespace Mz
