// SPDX-License-Identifier: BSL-1.0
/// What arrives from another process, as an input of a fuzzer.
#pragma once

#include "components/componentTools/probing/frames.h"
#include "fuzz/fuzz.h"

#include <string>

namespace Mz::Fuzz {

/// Returns the bytes that arrive: the rest of the input; or, if it is `framed`, the messages in it,
/// each a kind, a size of two bytes and a payload, in frames with the right checksums, which
/// mutations would not find.
inline std::string arriving(Input& input, bool framed) {
    if (!framed)
        return std::string(input.rest());
    std::string bytes;
    std::size_t count = 0;
    for (std::string_view kind; !(kind = input.take(1)).empty(); ++count) {
        std::size_t size = input.byte() << 8;
        size += input.byte();
        bytes += Tools::frameOf(static_cast<unsigned char>(kind[0]), input.take(size));
    }
    Tools::FrameReader frames(bytes);
    while (frames.next())
        --count;
    expect(count == 0 && frames.remaining() == 0, "each message in a right frame is read");
    return bytes;
}

} // namespace Mz::Fuzz
