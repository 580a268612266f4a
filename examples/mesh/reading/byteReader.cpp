// SPDX-License-Identifier: BSL-1.0
/// Fills one block of 64 KiB at a time. A block is the unit of progress and of interruption, so a
/// large file costs one virtual call per block and not one per byte. The size of the data is found
/// by seeking to its end and back; without it the progress stays at 0.
#include "byteReader.h"

#include "failure.h"

#include "components/componentManager/processControl.h"

#include <algorithm>
#include <cstring>
#include <functional>
#include <string_view>

namespace Meshes {

std::string quoted(std::string_view word) {
    constexpr std::size_t longest = 40;
    std::string result = "'";
    for (const char c : word.substr(0, longest))
        result.push_back(c >= ' ' && c <= '~' ? c : '?');
    return result + (word.size() > longest ? "...'" : "'");
}

namespace {

/// Returns the number of bytes from the current position to the end. Restores the position.
std::optional<std::uint64_t> remainingBytes(Mz::QrBufferedIO& io) {
    const Mz::int64 begin = io.tell();
    if (begin < 0)
        return std::nullopt;
    const Mz::int64 end = io.seek(0, 2);
    io.seek(begin, 0);
    return end >= begin ? std::optional(static_cast<std::uint64_t>(end - begin)) : std::nullopt;
}

} // namespace

ByteReader::ByteReader(Mz::QrBufferedIO& io, Mz::QrProcessControl* controller)
    : io(io), controller(controller), block(new unsigned char[blockSize]),
      total(remainingBytes(io)) {}

bool ByteReader::fill() {
    if (ended)
        return false;
    checkpoint();
    blockOffset += filled;
    position = 0;
    filled = 0;
    while (filled < blockSize) {
        const int wanted = blockSize - static_cast<int>(filled);
        const int count = io.read(block.get() + filled, wanted);
        if (count <= 0)
            break;
        filled += static_cast<std::size_t>(std::min(count, wanted));
    }
    ended = filled == 0;
    return !ended;
}

void ByteReader::checkpoint() {
    if (!controller)
        return;
    if (controller->isInterrupted())
        throw ImportInterrupted();
    if (!controller->isProgressShown())
        return;
    const double fraction =
        total && *total > 0 ? static_cast<double>(offset()) / static_cast<double>(*total) : 0.0;
    if (!controller->progress(static_cast<float>(std::min(fraction, 1.0)), L"Reading"))
        throw ImportInterrupted();
}

std::span<const unsigned char> ByteReader::lookAhead(std::size_t count) {
    if (peek() == end)
        return {};
    return {block.get() + position, std::min(count, filled - position)};
}

std::size_t ByteReader::read(std::span<unsigned char> bytes) {
    std::size_t done = 0;
    while (done < bytes.size() && peek() != end) {
        const std::size_t part = std::min(bytes.size() - done, filled - position);
        std::memcpy(bytes.data() + done, block.get() + position, part);
        position += part;
        done += part;
    }
    return done;
}

std::uint64_t ByteReader::skip(std::uint64_t count) {
    std::uint64_t done = 0;
    while (done < count && peek() != end) {
        const auto part = std::min<std::uint64_t>(count - done, filled - position);
        position += static_cast<std::size_t>(part);
        done += part;
    }
    return done;
}

void ByteReader::skipByteOrderMark() {
    constexpr unsigned char mark[] = {0xEF, 0xBB, 0xBF};
    if (std::ranges::equal(lookAhead(sizeof mark), mark))
        position += sizeof mark;
}

void ByteReader::fail(std::uint64_t at, const std::string& what) {
    throw ImportFailure{"byte " + std::to_string(at) + ": " + what};
}

} // namespace Meshes
