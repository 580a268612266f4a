// SPDX-License-Identifier: BSL-1.0
/// Reads the first bytes into an array, which stays zero where the file is shorter.
#include "signatures.h"

#include <array>
#include <cstdint>
#include <string_view>

namespace {

using FirstBytes = std::array<unsigned char, 18>;

FirstBytes firstBytes(Mz::QrBufferedIO& io) {
    FirstBytes bytes{};
    io.read(bytes.data(), static_cast<int>(bytes.size()));
    return bytes;
}

bool begins(const FirstBytes& bytes, std::string_view signature) {
    for (std::size_t index = 0; index < signature.size(); ++index)
        if (bytes[index] != static_cast<unsigned char>(signature[index]))
            return false;
    return true;
}

std::uint32_t littleEndian(const FirstBytes& bytes, std::size_t at) {
    return bytes[at] | static_cast<std::uint32_t>(bytes[at + 1]) << 8 |
           static_cast<std::uint32_t>(bytes[at + 2]) << 16 |
           static_cast<std::uint32_t>(bytes[at + 3]) << 24;
}

} // namespace

bool isPng(Mz::QrBufferedIO& io) {
    using namespace std::string_view_literals;
    return begins(firstBytes(io), "\x89PNG\r\n\x1A\n\0\0\0\x0DIHDR"sv);
}

bool isJpeg(Mz::QrBufferedIO& io) {
    const FirstBytes bytes = firstBytes(io);
    return begins(bytes, "\xFF\xD8\xFF") && bytes[3] >= 0xC0 && bytes[3] != 0xFF;
}

bool isBmp(Mz::QrBufferedIO& io) {
    const FirstBytes bytes = firstBytes(io);
    const std::uint32_t pixelOffset = littleEndian(bytes, 10);
    const std::uint32_t headerSize = littleEndian(bytes, 14);
    const bool knownHeader = headerSize == 12 || headerSize == 40 || headerSize == 56 ||
                             headerSize == 108 || headerSize == 124;
    return begins(bytes, "BM") && knownHeader && pixelOffset >= 14 + headerSize;
}
