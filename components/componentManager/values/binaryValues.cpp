// SPDX-License-Identifier: BSL-1.0
/// The binary half of `QrStream`: each type has a wire type of fixed width, whose bytes are
/// reversed in blocks on writing and in place after reading. A single value, the most frequent
/// case, skips the blocks and goes straight to the standard buffer where the caller cannot tell the
/// difference. `bool` has its own reader, because a byte other than 0 and 1 is not a valid `bool`
/// in memory.
#include "components/componentManager/buffers/directBuffer.h"
#include "components/componentManager/stream.h"

#include <algorithm>
#include <bit>
#include <cstdint>
#include <cstring>
#include <iosfwd>
#include <limits>
#include <string>
#include <type_traits>

namespace Mz {

namespace {

constexpr const char* source = "components/componentManager/stream";

/// Arrays are written in blocks of at most this many bytes.
constexpr int blockSize = 1024;

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

std::uint8_t reversed(std::uint8_t bits) {
    return bits;
}
std::uint16_t reversed(std::uint16_t bits) {
    return __builtin_bswap16(bits);
}
std::uint32_t reversed(std::uint32_t bits) {
    return __builtin_bswap32(bits);
}
std::uint64_t reversed(std::uint64_t bits) {
    return __builtin_bswap64(bits);
}

static_assert(std::endian::native == std::endian::little);

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
    return reversed(std::bit_cast<WireBits<T>>(static_cast<WireType<T>>(value)));
}

/// Writes one value without a block, straight to the standard buffer where possible.
template <class T>
void writeValue(QrBufferedIO& io, T value) {
    if (!fits(value))
        throw QrStreamEx::ExWriteError(source, __LINE__);
    constexpr int width = sizeof(WireType<T>);
    const auto bits = packed(value);
    char bytes[width];
    std::memcpy(bytes, &bits, width);
    std::ostream* const out = StandardStreams::outputUnder(io);
    if (std::streambuf* const buffer = out ? directBuffer(*out) : nullptr)
        writeDirectly(*out, *buffer, bytes, width);
    else
        io.write(bytes, width);
}

/// Packs up to `count` values into `block`, stops before one that does not fit, and returns the
/// number packed.
template <class T>
int packBlock(const T* values, int count, WireBits<T>* block) {
    int ready = 0;
    for (; ready < count; ++ready) {
        if constexpr (!alwaysFits<T>)
            if (!fits(values[ready]))
                break;
        block[ready] = packed(values[ready]);
    }
    return ready;
}

template <class T>
void writeValues(QrBufferedIO& io, const T* values, int count) {
    constexpr int width = sizeof(WireType<T>);
    constexpr int perBlock = blockSize / width;
    WireBits<T> block[perBlock];
    for (int done = 0; done < count;) {
        const int wanted = std::min(perBlock, count - done);
        const int ready = packBlock(values + done, wanted, block);
        if (ready > 0)
            io.write(block, ready * width);
        if (ready < wanted) // The values before it are written, as in text.
            throw QrStreamEx::ExWriteError(source, __LINE__);
        done += ready;
    }
}

/// Writes values of one byte without a copy.
void writeBytes(QrBufferedIO& io, const void* values, int count) {
    const auto* bytes = static_cast<const char*>(values);
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
    return static_cast<T>(std::bit_cast<WireType<T>>(reversed(bits)));
}

/// Converts `count` packed values at the front of the array into values of the host, in place.
template <class T>
void unpack(T* values, int count) {
    const auto* packed = reinterpret_cast<const char*>(values);
    constexpr std::size_t width = sizeof(WireType<T>);
    const auto size = static_cast<std::size_t>(count);
    if constexpr (sizeof(T) == width)
        for (std::size_t index = 0; index < size; ++index)
            values[index] = unpacked<T>(packed + index * width);
    else // From the last to the first, so that none overwrites a packed one.
        for (std::size_t index = size; index-- > 0;)
            values[index] = unpacked<T>(packed + index * width);
}

template <class T>
int readValues(QrBufferedIO& io, T* values, int count) {
    constexpr int width = sizeof(WireType<T>);
    int got = 0;
    std::istream* const in = count == 1 ? StandardStreams::inputUnder(io) : nullptr;
    if (std::streambuf* const buffer = in ? directBuffer(*in) : nullptr)
        got = readDirectly(*in, *buffer, reinterpret_cast<char*>(values), width) / width;
    else
        got = readBlock(io, values, count, width);
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
    if (count < 1)
        return;
    if (separatorPending)
        endText();
    if (count == 1)
        writeValue(io(), values);
    else if constexpr (sizeof(T) == 1 && !std::is_same_v<T, bool>)
        writeBytes(io(), &values, count);
    else
        writeValues(io(), &values, count);
}

template <class T>
int QrStream::readBinary(T& values, int count) {
    if (count < 1)
        return 0;
    if (separatorPending)
        skipSeparator();
    if constexpr (std::is_same_v<T, bool>)
        return readBools(io(), &values, count);
    else
        return readValues(io(), &values, count);
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
