// SPDX-License-Identifier: BSL-1.0
/// The frames in which `mzcomponents-probe` sends its messages.
///
/// The library in the probe can write into the same pipe, and the probe may end after any byte. A
/// frame therefore has a magic number, a kind, a length and a checksum, and the reader trusts
/// nothing.
#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

namespace Mz::Tools {

/// Returns the bytes of one message. Each user of frames has its own range of kinds.
std::string frameOf(unsigned char kind, std::string_view payload);

/// One message. The payload refers to the bytes that the reader was given.
struct Frame {
    unsigned char kind = 0;
    std::string_view payload;
};

/// Takes messages from the front of a sequence of bytes, which must outlive it.
class FrameReader {
  public:
    explicit FrameReader(std::string_view bytes) : rest(bytes) {}

    /// Returns the next message; `std::nullopt` at the end, and before an invalid or incomplete
    /// message.
    std::optional<Frame> next();

    /// Returns the number of bytes after the last message that was returned.
    std::size_t remaining() const { return rest.size(); }

    /// Returns whether the reader stopped at bytes that are not a valid message.
    bool garbled() const { return invalid; }
    /// Returns whether the reader stopped at an incomplete message.
    bool cutOff() const { return incomplete; }

  private:
    std::string_view rest;
    bool invalid = false, incomplete = false;
};

} // namespace Mz::Tools
