// SPDX-License-Identifier: BSL-1.0
/// The bytes that go to a standard stream. With `ByteSource`, the only code that decides when a
/// short cut past the stream is allowed, and takes it.
#pragma once

#include "components/componentManager/buffers/standardBuffer.h"
#include "components/componentManager/support/alwaysInline.h"

#include <cstddef>
#include <cstring>
#include <exception>

namespace Mz {

/// Throws the exception of the output buffer for a medium that fails. Defined beside that buffer,
/// whose source name it records.
[[noreturn]] void throwBrokenOutput();

/// The output of a standard stream for one operation: state and buffer of the stream are looked at
/// when the sink is made.
///
/// `put` and `write` make the same calls of the stream's buffer as `ostream::put` and
/// `ostream::write`. A *free* sink, whose buffer is exactly one of the standard library, takes
/// bytes in pieces of any size, and in place.
class ByteSink {
  public:
    explicit ByteSink(std::ostream& stream) : out(&stream), buffer(unguardedBuffer(stream)) {}

    /// The output of the stream under `io`. There is none if the class of `io` is not exactly
    /// `QrOutBuffer`; the sink is then not available.
    MZ_ALWAYS_INLINE explicit ByteSink(const QrBufferedIO& io)
        : out(StandardStreams::outputUnder(io)), buffer(out ? unguardedBuffer(*out) : nullptr) {}

    /// Returns whether the bytes go to the stream's buffer without the guard of the stream.
    bool isAvailable() const { return buffer != nullptr; }

    /// Returns whether no caller can observe in which pieces the bytes are written.
    bool isFree() const { return buffer && bufferKind(*buffer) != BufferKind::Foreign; }

    /// Returns where up to `roomSize()` bytes can be written in place, which `advance` then makes
    /// part of the output; null if there is room for fewer than `size` bytes. Bytes after those
    /// that are advanced over must remain as they are: they may be output that is overwritten.
    MZ_ALWAYS_INLINE char* room(std::ptrdiff_t size) const {
        return isFree() && roomSize() >= size ? (buffer->*&BufferAreas::pptr)() : nullptr;
    }

    /// Returns the number of bytes that can be written in place. The sink must be free.
    std::ptrdiff_t roomSize() const {
        return (buffer->*&BufferAreas::epptr)() - (buffer->*&BufferAreas::pptr)();
    }

    void advance(std::ptrdiff_t size) const {
        (buffer->*&BufferAreas::pbump)(static_cast<int>(size));
    }

    /// Returns whether an array is better written in place than in blocks: not for a file, which
    /// receives blocks at once.
    bool prefersPlace() const { return buffer && bufferKind(*buffer) == BufferKind::Memory; }

    /// Writes one byte. A failure is only in the flags of the stream.
    void put(char byte) const {
        if (buffer)
            call([&] { return buffer->sputc(byte) != std::streambuf::traits_type::eof(); });
        else
            operate(*out, [&] { out->put(byte); });
    }

    /// Writes `size` bytes by one call. A failure is only in the flags of the stream.
    void put(const char* data, int size) const {
        if (buffer)
            call([&] { return buffer->sputn(data, size) == size; });
        else
            operate(*out, [&] { out->write(data, size); });
    }

    /// Writes `size` bytes by one call.
    ///
    /// \throws QrStreamEx::ExWriteError if the medium fails
    void write(const char* data, int size) const {
        put(data, size);
        if (out->bad()) [[unlikely]]
            throwBrokenOutput();
    }

  private:
    /// Runs a call of the buffer. Like the guard, flushes after it if the stream is in `unitbuf` by
    /// then, which a foreign buffer may have set.
    template <class Work>
    void call(Work&& work) const {
        directly(*out, work);
        if ((out->flags() & std::ios::unitbuf) && std::uncaught_exceptions() == 0) [[unlikely]]
            ignoringExceptions([&] { synchronise(*out); });
    }

    std::ostream* out;
    std::streambuf* buffer;
};

} // namespace Mz
