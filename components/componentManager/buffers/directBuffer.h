/// The way past a standard stream to its buffer, taken where nobody can tell the difference.
///
/// A standard stream guards every single operation, which costs several times what moving a value
/// costs. What the guard does is nothing as long as the stream is in order, is tied to no other and
/// need not flush; and which calls a buffer of the standard library gets is seen by nobody.
/// Anything else, a buffer that somebody wrote himself included, gets every call as ever.
#pragma once

#include "components/componentManager/bufferio.h"
#include "components/componentManager/buffers/ioGuard.h"

#include <fstream>
#include <istream>
#include <ostream>
#include <sstream>
#include <typeinfo>

namespace Mz {

/// Whether `buffer` is exactly one of the standard library's own.
inline bool isStandardBuffer(const std::streambuf& buffer) {
    const std::type_info& type = typeid(buffer);
    // Mostly there is one description of a type in a process; comparing two takes longer.
    return &type == &typeid(std::stringbuf) || &type == &typeid(std::filebuf) ||
           type == typeid(std::stringbuf) || type == typeid(std::filebuf);
}

/// The buffer of `stream`, where it may be used instead of the stream at this moment; else null.
template <class Stream>
std::streambuf* directBuffer(const Stream& stream) {
    if (!stream.good() || stream.tie() || (stream.flags() & std::ios::unitbuf))
        return nullptr;
    std::streambuf* const buffer = stream.rdbuf();
    return isStandardBuffer(*buffer) ? buffer : nullptr;
}

/// Runs `work` on the buffer of `stream`, which answers whether it succeeded; if it did not, or
/// threw, the stream is broken, as after an operation of its own.
template <class Work>
__attribute__((no_sanitize("undefined"))) void directly(std::ios& stream, Work&& work) {
    bool succeeded = false;
    try {
        succeeded = work();
    } catch (abi::__forced_unwind&) {
        ignoringExceptions([&] { stream.setstate(std::ios::badbit); });
        throw;
    } catch (...) {
        // What is thrown where the stream is not asked is dropped where it is.
    }
    if (!succeeded) [[unlikely]]
        ignoringExceptions([&] { stream.setstate(std::ios::badbit); });
}

/// The library's own buffers, seen from within.
struct StandardStreams {
    /// The standard stream under `io` if that is exactly a `QrInBuffer`, else null.
    static std::istream* inputUnder(const QrBufferedIO& io) {
        return &typeid(io) == &typeid(QrInBuffer) ? static_cast<const QrInBuffer&>(io).in : nullptr;
    }
    /// The standard stream under `io` if that is exactly a `QrOutBuffer`, else null.
    static std::ostream* outputUnder(const QrBufferedIO& io) {
        return &typeid(io) == &typeid(QrOutBuffer) ? static_cast<const QrOutBuffer&>(io).out
                                                   : nullptr;
    }
};

/// What the buffers raise when the medium is broken.
[[noreturn]] void throwBrokenInput();
[[noreturn]] void throwBrokenOutput();

/// Writes to the `buffer` of `out` as `QrOutBuffer::write` does.
inline void writeDirectly(std::ostream& out, std::streambuf& buffer, const char* data, int size) {
    directly(out, [&] { return buffer.sputn(data, size) == size; });
    if (out.bad()) [[unlikely]]
        throwBrokenOutput();
}

/// Reads from the `buffer` of `in` as `QrInBuffer::read` does.
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

/// The next byte of the `buffer` of `in`, which stays unread: 0 to 255, or -1 at the end.
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
