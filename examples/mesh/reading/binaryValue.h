/// Numbers in binary data, of either byte order, whatever this machine's own is.
#pragma once

#include <bit>
#include <cstdint>
#include <span>

namespace Meshes {

/// The unsigned number in `bytes`, of which there are at most eight.
inline std::uint64_t unsignedValue(std::span<const unsigned char> bytes, bool bigEndian) {
    std::uint64_t value = 0;
    for (std::size_t index = 0; index < bytes.size(); ++index)
        value = value << 8 | bytes[bigEndian ? index : bytes.size() - 1 - index];
    return value;
}

/// The IEEE number of 32 bits in `bytes`, of which there are four.
inline float floatValue(std::span<const unsigned char> bytes, bool bigEndian) {
    return std::bit_cast<float>(static_cast<std::uint32_t>(unsignedValue(bytes, bigEndian)));
}

} // namespace Meshes
