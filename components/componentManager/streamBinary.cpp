#include "components/componentManager/stream.h"

#include <algorithm>
#include <bit>
#include <cstdint>
#include <cstring>
#include <limits>
#include <type_traits>

namespace Mz {

namespace {

constexpr const char* source = "components/componentManager/stream";

/// Binary data goes out in blocks of at most this many bytes.
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

/// The type whose width a value has in binary data: that of `T`, but for types whose width differs
/// from platform to platform.
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

/// Whether binary data can hold the value as it is.
template <class T>
bool fits(T value) {
    return static_cast<T>(static_cast<WireType<T>>(value)) == value;
}

/// Floats go by their bits, NaNs included; only integers can be too wide.
template <>
bool fits(float) {
    return true;
}
template <>
bool fits(double) {
    return true;
}

template <class T>
void writeValues(QrBufferedIO& io, const T* values, int count) {
    constexpr int width = sizeof(WireType<T>);
    constexpr int perBlock = blockSize / width;
    WireBits<T> block[perBlock];
    for (int done = 0; done < count;) {
        const int wanted = std::min(perBlock, count - done);
        int ready = 0;
        for (; ready < wanted && fits(values[done + ready]); ++ready)
            block[ready] = reversed(
                std::bit_cast<WireBits<T>>(static_cast<WireType<T>>(values[done + ready])));
        if (ready > 0)
            io.write(block, ready * width);
        if (ready < wanted) // What came before it is written, as it is with text.
            throw QrStreamEx::ExWriteError(source, __LINE__);
        done += ready;
    }
}

/// Single bytes are written from where they stand.
void writeBytes(QrBufferedIO& io, const void* values, int count) {
    const auto* bytes = static_cast<const char*>(values);
    for (int done = 0; done < count; done += blockSize)
        io.write(bytes + done, std::min(blockSize, count - done));
}

/// Reads bytes in one call of the IO, or in as few as an `int` can count them, and returns how many
/// whole values of `width` bytes came.
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

/// Turns `count` values, which stand packed at the front of the array as they were read, into
/// values of the host. From the last to the first: none overwrites one that is still packed.
template <class T>
void unpack(T* values, int count) {
    constexpr std::size_t width = sizeof(WireType<T>);
    static_assert(sizeof(T) >= width);
    const auto* packed = reinterpret_cast<const char*>(values);
    for (auto index = static_cast<std::size_t>(count); index-- > 0;) {
        WireBits<T> bits;
        std::memcpy(&bits, packed + index * width, width);
        values[index] = static_cast<T>(std::bit_cast<WireType<T>>(reversed(bits)));
    }
}

template <class T>
int readValues(QrBufferedIO& io, T* values, int count) {
    const int got = readBlock(io, values, count, sizeof(WireType<T>));
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
    endText();
    if constexpr (sizeof(T) == 1 && !std::is_same_v<T, bool>)
        writeBytes(io(), &values, count);
    else
        writeValues(io(), &values, count);
}

template <class T>
int QrStream::readBinary(T& values, int count) {
    if (count < 1)
        return 0;
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
