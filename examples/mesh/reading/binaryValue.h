// SPDX-License-Identifier: BSL-1.0
/// Conversion of numbers from binary data in either byte order, on a machine of any byte order.
#pragma once

#include <bit>
#include <cstdint>
#include <span>

namespace Meshes {

/// Returns the unsigned number in `bytes`, which has at most eight elements.
inline std::uint64_t unsignedValue(std::span<const unsigned char> bytes, bool bigEndian) {
    std::uint64_t value = 0;
    for (std::size_t index = 0; index < bytes.size(); ++index)
        value = value << 8 | bytes[bigEndian ? index : bytes.size() - 1 - index];
    return value;
}

/// Returns the 32-bit IEEE number in `bytes`, which has four elements.
inline float floatValue(std::span<const unsigned char> bytes, bool bigEndian) {
    return std::bit_cast<float>(static_cast<std::uint32_t>(unsignedValue(bytes, bigEndian)));
}

} // namespace Meshes
