// SPDX-License-Identifier: BSL-1.0
/// Direct access to the buffer of a standard stream, where the caller cannot tell the difference.
///
/// The guard of a standard stream takes several times as long as the transfer of a value. It has no
/// effect if the stream is in a good state, is not tied and is not flushed after each operation.
/// The calls that a buffer of the standard library receives cannot be observed. Any other stream,
/// and any other class of buffer, receives every call.
#pragma once

#include "components/componentManager/bufferio.h"
#include "components/componentManager/buffers/ioGuard.h"

#include <fstream>
#include <istream>
#include <ostream>
#include <sstream>
#include <typeinfo>

namespace Mz {

/// Returns whether the class of `buffer` is exactly one of the standard library.
inline bool isStandardBuffer(const std::streambuf& buffer) {
    const std::type_info& type = typeid(buffer);
    // A process usually has one description of each type, and comparing addresses is faster.
    return &type == &typeid(std::stringbuf) || &type == &typeid(std::filebuf) ||
           type == typeid(std::stringbuf) || type == typeid(std::filebuf);
}

/// Returns the buffer of `stream` if it may be used in place of the stream now, else null.
template <class Stream>
std::streambuf* directBuffer(const Stream& stream) {
    if (!stream.good() || stream.tie() || (stream.flags() & std::ios::unitbuf))
        return nullptr;
    std::streambuf* const buffer = stream.rdbuf();
    return isStandardBuffer(*buffer) ? buffer : nullptr;
}

/// Runs `work`, an operation on the buffer of `stream`. If it returns false or throws, sets badbit,
/// as the same operation of the stream does.
template <class Work>
__attribute__((no_sanitize("undefined"))) void directly(std::ios& stream, Work&& work) {
    bool succeeded = false;
    try {
        succeeded = work();
    } catch (abi::__forced_unwind&) {
        ignoringExceptions([&] { stream.setstate(std::ios::badbit); });
        throw;
    } catch (...) {
        // The failure is in the flags, as after an operation of the stream.
    }
    if (!succeeded) [[unlikely]]
        ignoringExceptions([&] { stream.setstate(std::ios::badbit); });
}

/// Access to the standard streams of this library's buffers.
struct StandardStreams {
    /// Returns the standard stream of `io` if its class is exactly `QrInBuffer`, else null.
    static std::istream* inputUnder(const QrBufferedIO& io) {
        return &typeid(io) == &typeid(QrInBuffer) ? static_cast<const QrInBuffer&>(io).in : nullptr;
    }
    /// Returns the standard stream of `io` if its class is exactly `QrOutBuffer`, else null.
    static std::ostream* outputUnder(const QrBufferedIO& io) {
        return &typeid(io) == &typeid(QrOutBuffer) ? static_cast<const QrOutBuffer&>(io).out
                                                   : nullptr;
    }
};

/// Throw the exceptions of the buffers for a medium that fails. Defined beside each buffer, whose
/// source name they record.
[[noreturn]] void throwBrokenInput();
[[noreturn]] void throwBrokenOutput();

/// Writes to `buffer`, that of `out`, as `QrOutBuffer::write` does.
inline void writeDirectly(std::ostream& out, std::streambuf& buffer, const char* data, int size) {
    directly(out, [&] { return buffer.sputn(data, size) == size; });
    if (out.bad()) [[unlikely]]
        throwBrokenOutput();
}

/// Reads from `buffer`, that of `in`, as `QrInBuffer::read` does. Returns the number of bytes read.
inline int readDirectly(std::istream& in, std::streambuf& buffer, char* data, int size) {
    std::streamsize got = 0;
    directly(in, [&] {
        got = buffer.sgetn(data, size);
        return true;
    });
    if (got < size) [[unlikely]] {
        if (in.bad())
            throwBrokenInput();
        ignoringExceptions([&] { in.setstate(std::ios::eofbit | std::ios::failbit); });
    }
    return static_cast<int>(got);
}

/// Returns the next byte of `buffer`, that of `in`, which stays unread: 0 to 255, or -1 at the end.
inline int peekDirectly(std::istream& in, std::streambuf& buffer) {
    constexpr int end = std::streambuf::traits_type::eof();
    int byte = end;
    directly(in, [&] {
        byte = buffer.sgetc();
        return true;
    });
    if (byte != end) [[likely]]
        return byte;
    if (in.bad())
        throwBrokenInput();
    return -1;
}

} // namespace Mz
