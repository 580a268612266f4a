// SPDX-License-Identifier: BSL-1.0
/// The binary half of `QrStream`: each type has a wire type of fixed width, whose bytes are
/// reversed in blocks on writing and in place after reading, unless the host is big-endian as the
/// format is. Where no caller can tell the
/// difference, values are reversed from and to the areas of the standard buffer, and blocks are
/// larger. `bool` has its own reader, because a byte other than 0 and 1 is not a valid `bool` in
/// memory.
#include "components/componentManager/buffers/byteSink.h"
#include "components/componentManager/buffers/byteSource.h"
#include "components/componentManager/stream.h"
#include "components/componentManager/support/alwaysInline.h"

#include <algorithm>
#include <bit>
#include <cstdint>
#include <cstring>
#include <limits>
#include <memory>
#include <new>
#include <string>
#include <string_view>
#include <type_traits>

namespace Mz {

namespace {

constexpr const char* source = "components/componentManager/stream";

/// Arrays are written to an IO in blocks of at most this many bytes.
constexpr int blockSize = 1024;

/// The same for a free sink or source. A file's buffer passes such a block on by one system call.
constexpr int largeBlockSize = 64 * 1024;

/// The largest number of values that are written or read in place in one step, so that the size of
/// a step fits an `int`.
constexpr std::ptrdiff_t largestStep = 1 << 20;

template <std::size_t Width>
struct Bits;
template <>
struct Bits<1> {
    using Type = std::uint8_t;
};
template <>
struct Bits<2> {
    using Type = std::uint16_t;
};
template <>
struct Bits<4> {
    using Type = std::uint32_t;
};
template <>
struct Bits<8> {
    using Type = std::uint64_t;
};

constexpr bool littleEndian = std::endian::native == std::endian::little;
static_assert(littleEndian || std::endian::native == std::endian::big);

/// Returns the bits in the order of the format; in that of the host, given those of the format.
std::uint8_t reordered(std::uint8_t bits) {
    return bits;
}
std::uint16_t reordered(std::uint16_t bits) {
    return littleEndian ? __builtin_bswap16(bits) : bits;
}
std::uint32_t reordered(std::uint32_t bits) {
    return littleEndian ? __builtin_bswap32(bits) : bits;
}
std::uint64_t reordered(std::uint64_t bits) {
    return littleEndian ? __builtin_bswap64(bits) : bits;
}

/// The type whose width and bits a `T` has in binary data. It is `T` itself, except for `bool` and
/// the types whose width depends on the platform.
template <class T>
struct Wire {
    using Type = T;
};
template <>
struct Wire<bool> {
    using Type = std::uint8_t;
};
template <>
struct Wire<long> {
    using Type = std::int32_t;
};
template <>
struct Wire<unsigned long> {
    using Type = std::uint32_t;
};
template <>
struct Wire<wchar_t> {
    using Type = std::uint16_t;
};

template <class T>
using WireType = typename Wire<T>::Type;
template <class T>
using WireBits = typename Bits<sizeof(WireType<T>)>::Type;

/// Whether binary data holds every value of the type.
template <class T>
constexpr bool alwaysFits = sizeof(T) == sizeof(WireType<T>);

/// Whether binary data can hold this value. Only integers can be too wide.
template <class T>
bool fits(T value) {
    if constexpr (alwaysFits<T>)
        return true;
    else
        return static_cast<T>(static_cast<WireType<T>>(value)) == value;
}

template <class T>
WireBits<T> packed(T value) {
    return reordered(std::bit_cast<WireBits<T>>(static_cast<WireType<T>>(value)));
}

/// Writes the bytes of one value by the call of the IO, or by the same call of its buffer.
template <class Bits>
[[gnu::noinline]] void writeBits(QrBufferedIO& io, const ByteSink& sink, Bits bits) {
    if (sink.isAvailable())
        sink.write(reinterpret_cast<const char*>(&bits), sizeof bits);
    else
        io.write(&bits, sizeof bits);
}

/// Writes one value without a block, in place where possible.
template <class T>
MZ_ALWAYS_INLINE inline void writeValue(QrBufferedIO& io, T value) {
    if constexpr (!alwaysFits<T>)
        if (!fits(value))
            throw QrStreamEx::ExWriteError(source, __LINE__);
    const auto bits = packed(value);
    const ByteSink sink(io);
    if (char* const place = sink.room(sizeof bits)) [[likely]] {
        std::memcpy(place, &bits, sizeof bits);
        sink.advance(sizeof bits);
    } else {
        writeBits(io, sink, bits);
    }
}

/// Converts `count` values of `Width` bytes between the order of the host and that of the format.
/// `to` may be `from`.
template <std::size_t Width>
[[gnu::noinline]] void reorderAll(char* to, const char* from, std::size_t count) {
    using Bits = typename Bits<Width>::Type;
    std::size_t at = 0;
    const std::size_t end = count * Width;
    if constexpr (Width == 4 && littleEndian) // Two at a time, in one word.
        for (; at + 2 * Width <= end; at += 2 * Width) {
            std::uint64_t two;
            std::memcpy(&two, from + at, sizeof two);
            two = std::rotl(reordered(two), 32);
            std::memcpy(to + at, &two, sizeof two);
        }
    for (; at != end; at += Width) {
        Bits bits;
        std::memcpy(&bits, from + at, sizeof bits);
        bits = reordered(bits);
        std::memcpy(to + at, &bits, sizeof bits);
    }
}

/// Packs up to `count` values to `to`, stops before one that does not fit, and returns the number
/// packed.
template <class T>
int pack(const T* values, int count, char* to) {
    constexpr std::size_t width = sizeof(WireType<T>);
    if constexpr (alwaysFits<T> && !std::is_same_v<T, bool>) {
        reorderAll<width>(to, reinterpret_cast<const char*>(values),
                          static_cast<std::size_t>(count));
        return count;
    } else {
        int ready = 0;
        for (; ready < count && fits(values[ready]); ++ready) {
            const auto bits = packed(values[ready]);
            std::memcpy(to + static_cast<std::size_t>(ready) * width, &bits, width);
        }
        return ready;
    }
}

/// Packs the values in blocks of at most `size` bytes at `block`, and passes each to `write`.
template <class T, class Write>
void writeBlocks(const T* values, int count, char* block, int size, Write write) {
    constexpr int width = sizeof(WireType<T>);
    for (int done = 0; done < count;) {
        const int wanted = std::min(size / width, count - done);
        const int ready = pack(values + done, wanted, block);
        if (ready > 0)
            write(block, ready * width);
        if (ready < wanted) // The values before it are written, as in text.
            throw QrStreamEx::ExWriteError(source, __LINE__);
        done += ready;
    }
}

/// Packs values in place, as many as the buffer has room for, and returns their number.
template <class T>
int writeInPlace(const ByteSink& sink, const T* values, int count) {
    constexpr int width = sizeof(WireType<T>);
    char* const place = sink.room(width);
    if (!place)
        return 0;
    const int wanted =
        static_cast<int>(std::min<std::ptrdiff_t>({sink.roomSize() / width, count, largestStep}));
    const int ready = pack(values, wanted, place);
    sink.advance(std::ptrdiff_t{ready} * width);
    if (ready < wanted)
        throw QrStreamEx::ExWriteError(source, __LINE__);
    return ready;
}

/// Writes an array to a free sink: in place, while the buffer has room and prefers it, then in
/// large blocks. A large block is not on the stack, which may be small. Without memory for it, the
/// blocks are those of an IO.
template <class T>
void writeFree(const ByteSink& sink, const T* values, int count) {
    constexpr int width = sizeof(WireType<T>);
    char small[blockSize];
    std::unique_ptr<char[]> large;
    for (int done = 0; done < count;) {
        const int placed =
            sink.prefersPlace() ? writeInPlace(sink, values + done, count - done) : 0;
        done += placed;
        if (placed > 0)
            continue;
        const int left = count - done;
        if (!large && left > blockSize / width)
            large.reset(new (std::nothrow) char[largeBlockSize]);
        const int size = large ? largeBlockSize : blockSize;
        const int wanted = std::min(size / width, left);
        writeBlocks(values + done, wanted, large ? large.get() : small, size,
                    [&](const char* block, int bytes) { sink.write(block, bytes); });
        done += wanted;
    }
}

/// Not inlined, so that a single value needs no stack for a block.
template <class T>
[[gnu::noinline]] void writeValues(QrBufferedIO& io, const T* values, int count) {
    if (const ByteSink sink(io); sink.isFree())
        return writeFree(sink, values, count);
    char block[blockSize];
    writeBlocks(values, count, block, blockSize,
                [&](const char* bytes, int size) { io.write(bytes, size); });
}

/// Writes values of one byte without a copy.
void writeBytes(QrBufferedIO& io, const void* values, int count) {
    const auto* bytes = static_cast<const char*>(values);
    if (const ByteSink sink(io); sink.isFree())
        return sink.write(bytes, count);
    for (int done = 0; done < count;) {
        const int size = std::min(blockSize, count - done);
        io.write(bytes + done, size);
        done += size;
    }
}

/// Reads `count` values of `width` bytes and returns the number of complete ones. Takes one call of
/// the IO, or as few as the range of `int` allows.
int readBlock(QrBufferedIO& io, void* values, int count, int width) {
    const int perCall = std::numeric_limits<int>::max() / width;
    int done = 0;
    while (done < count) {
        const int wanted = std::min(perCall, count - done);
        auto* at = static_cast<char*>(values) +
                   static_cast<std::size_t>(done) * static_cast<std::size_t>(width);
        const int got = std::max(io.read(at, wanted * width), 0) / width;
        done += std::min(got, wanted);
        if (got < wanted)
            break;
    }
    return done;
}

template <class T>
T unpacked(const char* packed) {
    WireBits<T> bits;
    std::memcpy(&bits, packed, sizeof bits);
    return static_cast<T>(std::bit_cast<WireType<T>>(reordered(bits)));
}

/// Converts `count` packed values at the front of the array into values of the host, in place.
template <class T>
void unpack(T* values, int count) {
    constexpr std::size_t width = sizeof(WireType<T>);
    auto* const bytes = reinterpret_cast<char*>(values);
    const auto size = static_cast<std::size_t>(count);
    if constexpr (alwaysFits<T>)
        reorderAll<width>(bytes, bytes, size);
    else // From the last to the first, so that none overwrites a packed one.
        for (std::size_t index = size; index-- > 0;)
            values[index] = unpacked<T>(bytes + index * width);
}

/// Converts values that the buffer holds, without a copy of their bytes, and returns their number.
template <class T>
int readInPlace(const ByteSource& source, T* values, int count) {
    constexpr std::ptrdiff_t width = sizeof(T);
    const std::string_view held = source.held();
    const int got = static_cast<int>(std::min<std::ptrdiff_t>(
        {static_cast<std::ptrdiff_t>(held.size()) / width, count, largestStep}));
    reorderAll<width>(reinterpret_cast<char*>(values), held.data(), static_cast<std::size_t>(got));
    source.take(got * width);
    return got;
}

/// Reads values of the width that they have in memory: those that the buffer holds in place, the
/// others in blocks, so that the bytes of a block are still in the cache when they are reversed.
template <class T>
int readFree(const ByteSource& source, T* values, int count) {
    constexpr int width = sizeof(T);
    constexpr int perBlock = largeBlockSize / width;
    for (int done = 0; done < count;) {
        if (const int taken = readInPlace(source, values + done, count - done); taken > 0) {
            done += taken;
            continue;
        }
        const int wanted = std::min(perBlock, count - done);
        const int got = source.read(reinterpret_cast<char*>(values + done), wanted * width) / width;
        unpack(values + done, got);
        done += got;
        if (got < wanted)
            return done;
    }
    return count;
}

/// Reads one value of which the buffer does not hold, or does not show, all bytes: by the call of
/// the IO or the same call of its buffer.
template <class T>
[[gnu::noinline]] int readBits(QrBufferedIO& io, const ByteSource& source, T& value) {
    constexpr int width = sizeof(WireType<T>);
    if (!source.isAvailable()) {
        const int got = readBlock(io, &value, 1, width);
        unpack(&value, got);
        return got;
    }
    const int got = source.readThrough(reinterpret_cast<char*>(&value), width) / width;
    unpack(&value, got);
    return got;
}

template <class T>
MZ_ALWAYS_INLINE inline int readValue(QrBufferedIO& io, T& value) {
    constexpr std::size_t width = sizeof(WireType<T>);
    const ByteSource source(io);
    if (!source.isFree()) [[unlikely]]
        return readBits(io, source, value);
    const std::string_view held = source.held();
    if (held.size() < width) [[unlikely]]
        return readBits(io, source, value);
    value = unpacked<T>(held.data());
    source.take(width);
    return 1;
}

template <class T>
[[gnu::noinline]] int readValues(QrBufferedIO& io, T* values, int count) {
    constexpr int width = sizeof(WireType<T>);
    if constexpr (alwaysFits<T> && sizeof(T) > 1)
        if (const ByteSource source(io); source.isFree())
            return readFree(source, values, count);
    const int got = readBlock(io, values, count, width);
    if constexpr (sizeof(T) > 1)
        unpack(values, got);
    return got;
}

int readBools(QrBufferedIO& io, bool* values, int count) {
    unsigned char block[blockSize];
    for (int done = 0; done < count;) {
        const int wanted = std::min(blockSize, count - done);
        const int got = std::clamp(io.read(block, wanted), 0, wanted);
        std::transform(block, block + got, values + done, [](unsigned char b) { return b != 0; });
        done += got;
        if (got < wanted)
            return done;
    }
    return std::max(count, 0);
}

} // namespace

template <class T>
void QrStream::writeBinary(const T& values, int count) {
    if (separatorPending && count > 0) [[unlikely]]
        endText();
    if (count == 1) [[likely]]
        writeValue(io(), values);
    else if (count < 1)
        return;
    else if constexpr (sizeof(T) == 1 && !std::is_same_v<T, bool>)
        writeBytes(io(), &values, count);
    else
        writeValues(io(), &values, count);
}

template <class T>
int QrStream::readBinary(T& values, int count) {
    if (separatorPending && count > 0) [[unlikely]]
        skipSeparator();
    if constexpr (std::is_same_v<T, bool>)
        return readBools(io(), &values, count);
    else if (count == 1) [[likely]]
        return readValue(io(), values);
    else
        return readValues(io(), &values, std::max(count, 0));
}

void QrStream::write(const unsigned long long& values, int count) {
    writeBinary(values, count);
}

void QrStream::write(const int64& values, int count) {
    writeBinary(values, count);
}

void QrStream::write(const double& values, int count) {
    writeBinary(values, count);
}

void QrStream::write(const float& values, int count) {
    writeBinary(values, count);
}

void QrStream::write(const bool& values, int count) {
    writeBinary(values, count);
}

void QrStream::write(const unsigned long& values, int count) {
    writeBinary(values, count);
}

void QrStream::write(const long& values, int count) {
    writeBinary(values, count);
}

void QrStream::write(const unsigned int& values, int count) {
    writeBinary(values, count);
}

void QrStream::write(const int& values, int count) {
    writeBinary(values, count);
}

void QrStream::write(const unsigned short& values, int count) {
    writeBinary(values, count);
}

void QrStream::write(const short& values, int count) {
    writeBinary(values, count);
}

void QrStream::write(const unsigned char& values, int count) {
    writeBinary(values, count);
}

void QrStream::write(const wchar_t& values, int count) {
    writeBinary(values, count);
}

void QrStream::write(const char& values, int count) {
    writeBinary(values, count);
}

void QrStream::write(const std::wstring& values, int count) {
    for (const std::wstring* value = &values; count > 0; ++value, --count) {
        if (value->size() > static_cast<std::size_t>(std::numeric_limits<int>::max()))
            throw QrStreamEx::ExWriteError(source, __LINE__);
        const int length = static_cast<int>(value->size());
        write(length, 1);
        io().writeChar(value->data(), length);
    }
}

int QrStream::read(unsigned long long& values, int count) {
    return readBinary(values, count);
}

int QrStream::read(int64& values, int count) {
    return readBinary(values, count);
}

int QrStream::read(double& values, int count) {
    return readBinary(values, count);
}

int QrStream::read(float& values, int count) {
    return readBinary(values, count);
}

int QrStream::read(bool& values, int count) {
    return readBinary(values, count);
}

int QrStream::read(unsigned long& values, int count) {
    return readBinary(values, count);
}

int QrStream::read(long& values, int count) {
    return readBinary(values, count);
}

int QrStream::read(unsigned int& values, int count) {
    return readBinary(values, count);
}

int QrStream::read(int& values, int count) {
    return readBinary(values, count);
}

int QrStream::read(unsigned short& values, int count) {
    return readBinary(values, count);
}

int QrStream::read(short& values, int count) {
    return readBinary(values, count);
}

int QrStream::read(unsigned char& values, int count) {
    return readBinary(values, count);
}

int QrStream::read(wchar_t& values, int count) {
    return readBinary(values, count);
}

int QrStream::read(char& values, int count) {
    return readBinary(values, count);
}

int QrStream::read(std::wstring& values, int count) {
    int done = 0;
    for (std::wstring* value = &values; done < count; ++value, ++done) {
        int length = 0;
        if (read(length, 1) == 0)
            break;
        if (!readCharacters(*value, length))
            throw QrStreamEx::ExReadError(source, __LINE__);
    }
    return done;
}

} // namespace Mz
