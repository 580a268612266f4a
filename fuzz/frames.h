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
    for (std::string_view kind; !(kind = input.take(1)).empty();) {
        std::size_t size = input.byte() << 8;
        size += input.byte();
        bytes += Tools::frameOf(static_cast<unsigned char>(kind[0]), input.take(size));
    }
    return bytes;
}

} // namespace Mz::Fuzz
