// SPDX-License-Identifier: BSL-1.0
/// The input of an import under a policy: a file or bytes in memory, with limits.
///
/// The limits are in a stream buffer, below the standard stream of a `QrInBuffer`: what builders
/// receive is the library's own input buffer, with all its rules. An exception of a stream buffer
/// becomes a failure of the medium there, which builders must handle anyway.
///
/// For `importFile.h`; hosts do not need these classes.
///
/// \since 0.2
#pragma once

#include <algorithm>
#include <array>
#include <chrono>
#include <cstddef>
#include <cstdint>
#include <functional>
#include <ios>
#include <optional>
#include <span>
#include <streambuf>
#include <utility>

namespace Mz::Kit::detail {

/// The limits of one import, and the first that was exceeded.
class ImportLimits {
  public:
    enum class Exceeded { none, bytes, time };

    /// Starts the clock.
    ImportLimits(std::optional<std::uint64_t> byteLimit,
                 std::optional<std::chrono::milliseconds> timeLimit)
        : bytes(byteLimit) {
        using Clock = std::chrono::steady_clock;
        using std::chrono::milliseconds;
        const auto now = Clock::now();
        // A duration that the clock cannot add is no limit.
        const auto longest =
            std::chrono::duration_cast<milliseconds>(Clock::time_point::max() - now);
        if (timeLimit && *timeLimit < longest)
            end = now + std::max(*timeLimit, milliseconds(0));
    }

    /// Returns whether the time is over.
    bool timeIsOver() {
        if (end && std::chrono::steady_clock::now() >= *end)
            note(Exceeded::time);
        return exceeded == Exceeded::time;
    }

    /// Returns whether an input of `size` bytes is too large. Records that if `isInput`.
    bool isTooLarge(std::uint64_t size, bool isInput = true) {
        const bool tooLarge = bytes && size > *bytes;
        if (tooLarge && isInput)
            note(Exceeded::bytes);
        return tooLarge;
    }

    /// Returns the first limit that was exceeded.
    Exceeded firstExceeded() const { return exceeded; }

  private:
    void note(Exceeded limit) {
        if (exceeded == Exceeded::none)
            exceeded = limit;
    }

    std::optional<std::uint64_t> bytes;
    std::optional<std::chrono::steady_clock::time_point> end;
    Exceeded exceeded = Exceeded::none;
};

/// Thrown by `LimitedInput`. Never leaves the standard stream.
struct LimitExceeded {};

/// A stream buffer that reads from a source, block by block, and checks the limits before each.
class LimitedInput final : public std::streambuf {
  public:
    /// Copies bytes from an offset to a block and returns their number, which is less than the size
    /// of the block at the end of the input only.
    using Source = std::function<std::size_t(std::uint64_t offset, std::span<char> block)>;

    /// \param inputSize  size of the input at the start, for positions relative to its end
    LimitedInput(Source bytes, std::uint64_t inputSize, ImportLimits& importLimits)
        : source(std::move(bytes)), size(inputSize), limits(importLimits) {}

  protected:
    int_type underflow() override {
        return load(position()) ? traits_type::to_int_type(*gptr()) : traits_type::eof();
    }

    /// Goes back to the block before, or replaces a byte of the block: builders may put back
    /// another byte than they have read.
    int_type pbackfail(int_type byte) override {
        const std::uint64_t at = position();
        if (at == 0 || (gptr() == eback() && !load(at - 1)))
            return traits_type::eof();
        if (position() == at)
            gbump(-1);
        if (!traits_type::eq_int_type(byte, traits_type::eof()))
            *gptr() = traits_type::to_char_type(byte);
        return traits_type::not_eof(byte);
    }

    pos_type seekoff(off_type offset, std::ios_base::seekdir from,
                     std::ios_base::openmode which) override {
        if (!(which & std::ios_base::in))
            return off_type(-1);
        const std::uint64_t base = from == std::ios_base::beg   ? 0
                                   : from == std::ios_base::cur ? position()
                                                                : size;
        const auto target = static_cast<off_type>(base) + offset;
        if (target < 0)
            return off_type(-1);
        if (static_cast<std::uint64_t>(target) != position()) {
            start = static_cast<std::uint64_t>(target);
            setg(block.data(), block.data(), block.data());
        }
        return target;
    }

    pos_type seekpos(pos_type target, std::ios_base::openmode which) override {
        return seekoff(off_type(target), std::ios_base::beg, which);
    }

  private:
    static constexpr std::uint64_t blockSize = 16 * 1024;

    std::uint64_t position() const { return start + static_cast<std::uint64_t>(gptr() - eback()); }

    /// Loads the block that contains the byte at `at` and returns whether there is this byte.
    bool load(std::uint64_t at) {
        if (limits.timeIsOver())
            throw LimitExceeded();
        const std::uint64_t first = at - at % blockSize;
        const std::size_t count = source(first, block);
        if (limits.isTooLarge(first + count))
            throw LimitExceeded();
        const std::size_t before = static_cast<std::size_t>(at - first);
        if (before >= count) { // The end of the input: no byte, and the position stays.
            start = at;
            setg(block.data(), block.data(), block.data());
            return false;
        }
        start = first;
        setg(block.data(), block.data() + before, block.data() + count);
        return true;
    }

    Source source;
    std::uint64_t size;
    ImportLimits& limits;
    std::uint64_t start = 0; ///< offset of the first byte of the block
    std::array<char, blockSize> block{};
};

} // namespace Mz::Kit::detail
