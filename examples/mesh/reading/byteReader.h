/// Bytes from a buffered IO, block by block, with progress.
#pragma once

#include "components/componentManager/bufferio.h"

#include <cstdint>
#include <memory>
#include <optional>
#include <span>
#include <string>

namespace Mz {
class QrProcessControl;
}

namespace Meshes {

/// Reads from where the IO stands to its end, in blocks of a fixed size, whatever the data says of
/// itself. The IO's own exceptions pass through.
class ByteReader {
  public:
    static constexpr int end = -1;

    /// With a controller, each block is reported as progress, and asks whether to go on: when not,
    /// `ImportInterrupted` is thrown. Null reports nothing.
    explicit ByteReader(Mz::QrBufferedIO& io, Mz::QrProcessControl* controller = nullptr);

    /// The next byte, 0 to 255, or `end`; `peek` leaves it where it is.
    int peek() { return position < filled || fill() ? block[position] : end; }
    int get() { return position < filled || fill() ? block[position++] : end; }

    /// Up to `count` of the next bytes, which stay where they are. Before anything was read these
    /// are fewer only at the end of the data, or beyond a block (64 KiB).
    std::span<const unsigned char> lookAhead(std::size_t count);

    /// Fills `bytes` and returns how many came; fewer only at the end of the data.
    std::size_t read(std::span<unsigned char> bytes);
    /// Passes over `count` bytes and returns how many there were.
    std::uint64_t skip(std::uint64_t count);

    /// Passes over the mark that some editors put in front of Unicode text.
    void skipByteOrderMark();

    /// How many bytes were read so far, and how many there are in all, where the IO can tell.
    std::uint64_t offset() const { return blockOffset + position; }
    std::optional<std::uint64_t> size() const { return total; }

    /// Gives up with the reason "byte 123: what", where 123 is `at`.
    [[noreturn]] static void fail(std::uint64_t at, const std::string& what);

  private:
    static constexpr int blockSize = 0x10000;

    bool fill();
    void checkpoint();

    Mz::QrBufferedIO& io;
    Mz::QrProcessControl* controller;
    std::unique_ptr<unsigned char[]> block;
    std::size_t position = 0;
    std::size_t filled = 0;
    std::uint64_t blockOffset = 0;
    bool ended = false; ///< nothing comes behind this block
    std::optional<std::uint64_t> total;
};

} // namespace Meshes
