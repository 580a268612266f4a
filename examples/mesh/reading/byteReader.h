// SPDX-License-Identifier: BSL-1.0
/// Reads bytes from a buffered IO, block by block, and reports progress.
#pragma once

#include "components/componentManager/bufferio.h"

#include <cstddef>
#include <cstdint>
#include <memory>
#include <optional>
#include <span>
#include <string>

namespace Mz {
class QrProcessControl;
}

namespace Meshes {

/// Reads from the current position of the IO to its end. Blocks have a fixed size, whatever counts
/// the data contains. Exceptions of the IO pass through.
class ByteReader {
  public:
    /// The result of `peek` and `get` at the end of the data.
    static constexpr int end = -1;

    /// Starts at the current position of `io`.
    ///
    /// \param controller receives progress before each block; reading throws `ImportInterrupted` if
    ///     it is interrupted or its `progress` returns false. Null reports nothing.
    explicit ByteReader(Mz::QrBufferedIO& io, Mz::QrProcessControl* controller = nullptr);

    /// Returns the next byte, 0 to 255, or `end`. `peek` does not consume it.
    int peek() { return position < filled || fill() ? block[position] : end; }
    int get() { return position < filled || fill() ? block[position++] : end; }

    /// Returns up to `count` of the next bytes, without consuming them. If nothing was read before,
    /// the result is shorter only at the end of the data or if `count` exceeds a block (64 KiB).
    std::span<const unsigned char> lookAhead(std::size_t count);

    /// Fills `bytes` and returns the number of bytes read; less than its size only at the end of
    /// the data.
    std::size_t read(std::span<unsigned char> bytes);
    /// Skips up to `count` bytes and returns the number of bytes skipped.
    std::uint64_t skip(std::uint64_t count);

    /// Skips a UTF-8 byte order mark, if there is one.
    void skipByteOrderMark();

    /// Returns the number of bytes read so far.
    std::uint64_t offset() const { return blockOffset + position; }
    /// Returns the total number of bytes; nothing if the IO cannot seek.
    std::optional<std::uint64_t> size() const { return total; }

    /// Throws `ImportFailure` with the reason "byte 123: what", where 123 is `at`.
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
    bool ended = false; ///< no block follows this one
    std::optional<std::uint64_t> total;
};

} // namespace Meshes
