// SPDX-License-Identifier: BSL-1.0
/// All numbers are big-endian. The checksum is FNV-1a, which is short and detects foreign bytes
/// well enough; a library that wants to forge a message could do so anyway.
#include "components/componentTools/probing/frames.h"

#include <algorithm>

namespace Mz::Tools {

namespace {

constexpr std::string_view mark{"\x4D\x5A\x50\x52", 4};
constexpr std::size_t headSize = 4 + 1 + 4;
constexpr std::size_t frameSize = headSize + 4;

std::uint32_t sumOf(std::string_view bytes) {
    std::uint32_t sum = 2166136261u;
    for (const char byte : bytes)
        sum = (sum ^ static_cast<unsigned char>(byte)) * 16777619u;
    return sum;
}

void appendWord(std::string& bytes, std::uint32_t word) {
    for (int shift = 24; shift >= 0; shift -= 8)
        bytes += static_cast<char>(word >> shift & 255);
}

std::uint32_t wordAt(std::string_view bytes, std::size_t offset) {
    std::uint32_t word = 0;
    for (std::size_t index = 0; index < 4; ++index)
        word = word << 8 | static_cast<unsigned char>(bytes[offset + index]);
    return word;
}

} // namespace

std::string frameOf(unsigned char kind, std::string_view payload) {
    std::string bytes(mark);
    bytes += static_cast<char>(kind);
    appendWord(bytes, static_cast<std::uint32_t>(payload.size()));
    bytes += payload;
    appendWord(bytes, sumOf(payload));
    return bytes;
}

std::optional<Frame> FrameReader::next() {
    if (rest.empty() || invalid || incomplete)
        return std::nullopt;
    const std::size_t known = std::min(rest.size(), mark.size());
    invalid = rest.substr(0, known) != mark.substr(0, known);
    if (invalid)
        return std::nullopt;
    incomplete = rest.size() < frameSize || wordAt(rest, 5) > rest.size() - frameSize;
    if (incomplete)
        return std::nullopt;
    const std::size_t size = wordAt(rest, 5);
    const Frame frame{static_cast<unsigned char>(rest[4]), rest.substr(headSize, size)};
    invalid = wordAt(rest, headSize + size) != sumOf(frame.payload);
    if (invalid)
        return std::nullopt;
    rest.remove_prefix(size + frameSize);
    return frame;
}

} // namespace Mz::Tools
