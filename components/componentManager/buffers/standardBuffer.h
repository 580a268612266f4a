// SPDX-License-Identifier: BSL-1.0
/// When and how the buffer of a standard stream is used in place of the stream. Only for
/// `ByteSource` and `ByteSink`.
///
/// The guard of a standard stream takes several times as long as the transfer of a value. It has no
/// effect if the stream is in a good state, is not tied and is not flushed after each operation.
/// Then the buffer receives the same calls without it, whatever its class.
///
/// The put and get areas of a buffer may only be used if the class of the buffer is exactly one of
/// the standard library: another class could observe that calls are missing.
#pragma once

#include "components/componentManager/bufferio.h"
#include "components/componentManager/buffers/ioGuard.h"
#include "components/componentManager/support/alwaysInline.h"

#include <atomic>
#include <fstream>
#include <istream>
#include <ostream>
#include <sstream>
#include <streambuf>
#include <typeinfo>

namespace Mz {

/// The class of a buffer.
enum class BufferKind { Foreign, Memory, File };

/// The class that was found last not to be of the standard library, so that the names of the
/// classes are not compared for each value. Never dereferenced: its library may be unloaded.
inline constinit std::atomic<const std::type_info*> lastForeignBuffer{nullptr};

/// Compares the names of the classes: a process may have several descriptions of one class.
[[gnu::noinline]] inline BufferKind bufferKindByName(const std::type_info& type) {
    if (&type == lastForeignBuffer.load(std::memory_order_relaxed))
        return BufferKind::Foreign;
    if (type == typeid(std::stringbuf))
        return BufferKind::Memory;
    if (type == typeid(std::filebuf))
        return BufferKind::File;
    lastForeignBuffer.store(&type, std::memory_order_relaxed);
    return BufferKind::Foreign;
}

/// Returns `Memory` for exactly `std::stringbuf` and `File` for exactly `std::filebuf`.
MZ_ALWAYS_INLINE inline BufferKind bufferKind(const std::streambuf& buffer) {
    const std::type_info& type = typeid(buffer);
    if (&type == &typeid(std::filebuf)) [[likely]]
        return BufferKind::File;
    if (&type == &typeid(std::stringbuf)) [[likely]]
        return BufferKind::Memory;
    return bufferKindByName(type);
}

/// Returns the buffer of `stream` if the guard of the stream has no effect now, else null.
template <class Stream>
MZ_ALWAYS_INLINE inline std::streambuf* unguardedBuffer(const Stream& source) {
    const std::ios& stream = source; // One conversion to the virtual base.
    if (!stream.good() || stream.tie() || (stream.flags() & std::ios::unitbuf)) [[unlikely]]
        return nullptr;
    return stream.rdbuf();
}

/// The areas of a buffer. The standard grants them to derived classes, and so to this one. There is
/// no object of it: its member functions are those of each buffer.
struct BufferAreas : std::streambuf {
    using std::streambuf::egptr;
    using std::streambuf::epptr;
    using std::streambuf::gbump;
    using std::streambuf::gptr;
    using std::streambuf::pbump;
    using std::streambuf::pptr;
};

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

} // namespace Mz
