// SPDX-License-Identifier: BSL-1.0
/// The bytes that come from a standard stream. With `ByteSink`, the only code that decides when a
/// short cut past the stream is allowed, and takes it.
#pragma once

#include "components/componentManager/buffers/standardBuffer.h"
#include "components/componentManager/support/alwaysInline.h"

#include <cstddef>
#include <cstring>
#include <string_view>

namespace Mz {

/// Throws the exception of the input buffer for a medium that fails. Defined beside that buffer,
/// whose source name it records.
[[noreturn]] void throwBrokenInput();

/// The input of a standard stream for one operation: state and buffer of the stream are looked at
/// when the source is made.
///
/// `get`, `putBack` and `read` make the same calls of the stream's buffer as the functions of
/// `istream`. A *free* source, whose buffer is exactly one of the standard library, also shows the
/// bytes that the buffer holds.
class ByteSource {
  public:
    static constexpr int endOfInput = -1;

    explicit ByteSource(std::istream& stream) : in(&stream), buffer(unguardedBuffer(stream)) {}

    /// The input of the stream under `io`. There is none if the class of `io` is not exactly
    /// `QrInBuffer`; the source is then not available.
    MZ_ALWAYS_INLINE explicit ByteSource(const QrBufferedIO& io)
        : in(StandardStreams::inputUnder(io)), buffer(in ? unguardedBuffer(*in) : nullptr) {}

    /// Returns whether the bytes come from the stream's buffer without the guard of the stream.
    bool isAvailable() const { return buffer != nullptr; }

    /// Returns whether no caller can observe in which pieces the bytes are read.
    bool isFree() const { return buffer && bufferKind(*buffer) != BufferKind::Foreign; }

    /// Returns the unread bytes that the buffer holds at the moment: a part of the input. The
    /// source must be free. Never reads from the medium, so it may be empty.
    std::string_view held() const {
        const char* const at = (buffer->*&BufferAreas::gptr)();
        return {at, static_cast<std::size_t>((buffer->*&BufferAreas::egptr)() - at)};
    }

    /// Takes the first `size` of the bytes that are held.
    void take(std::ptrdiff_t size) const { (buffer->*&BufferAreas::gbump)(static_cast<int>(size)); }

    /// Returns the next byte, which stays unread: 0 to 255, or -1 at the end. The source must be
    /// free. Afterwards the buffer holds the byte.
    ///
    /// \throws QrStreamEx::ExReadError if the medium fails
    int peek() const {
        int byte = end;
        directly(*in, [&] {
            byte = buffer->sgetc();
            return true;
        });
        if (byte != end) [[likely]]
            return byte;
        if (in->bad())
            throwBrokenInput();
        return endOfInput;
    }

    /// Returns the next byte, 0 to 255, or -1 if there is none, and clears the end of input. The
    /// caller checks for a medium that failed, after it has stored its bytes.
    int get() const {
        int byte = endOfInput;
        if (buffer) {
            directly(*in, [&] {
                byte = buffer->sbumpc();
                return true;
            });
            return byte == end ? endOfInput : byte;
        }
        operate(*in, [&] { byte = in->get(); });
        if (in->good())
            return byte;
        clearEndOfInput(*in);
        return endOfInput;
    }

    /// Puts a byte back. Clears the end of input. A failure is only in the flags of the stream.
    void putBack(char byte) const {
        if (buffer) {
            directly(*in, [&] { return buffer->sputbackc(byte) != end; });
            return;
        }
        ignoringExceptions([&] { in->clear(in->rdstate() & ~std::ios::eofbit); });
        operate(*in, [&] { in->putback(byte); });
    }

    /// Reads up to `size` bytes by one call. After a short count the stream is at the end of input.
    ///
    /// \return the number of bytes read
    /// \throws QrStreamEx::ExReadError if the medium fails
    int read(char* data, int size) const {
        if (!buffer)
            return readGuarded(data, size);
        return isFree() && takeHeld(data, size) ? size : readThrough(data, size);
    }

    /// Does what `read` does, by a call of the buffer in any case. The source must be available.
    int readThrough(char* data, int size) const {
        std::streamsize got = 0;
        directly(*in, [&] {
            got = buffer->sgetn(data, size);
            return true;
        });
        if (got < size) [[unlikely]] {
            if (in->bad())
                throwBrokenInput();
            ignoringExceptions([&] { in->setstate(std::ios::eofbit | std::ios::failbit); });
        }
        return static_cast<int>(got);
    }

  private:
    static constexpr int end = std::streambuf::traits_type::eof();

    /// Copies what a free source holds, if that is enough. Saves two virtual calls.
    bool takeHeld(char* data, int size) const {
        const std::string_view bytes = held();
        if (static_cast<std::ptrdiff_t>(bytes.size()) < size)
            return false;
        std::memcpy(data, bytes.data(), static_cast<std::size_t>(size));
        take(size);
        return true;
    }

    int readGuarded(char* data, int size) const {
        operate(*in, [&] { in->read(data, size); });
        if (in->bad())
            throwBrokenInput();
        return static_cast<int>(in->gcount());
    }

    std::istream* in;
    std::streambuf* buffer;
};

} // namespace Mz
