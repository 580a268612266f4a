// SPDX-License-Identifier: BSL-1.0
/// Streams on strings, and hexadecimal bytes, for the tests of streams.
#pragma once

#include "components/componentManager/binaryStream.h"
#include "components/componentManager/stream.h"
#include "components/componentManager/textStream.h"
#include "tests/streams/streamKinds.h"

#include <iterator>
#include <ostream>
#include <sstream>
#include <string>
#include <string_view>

namespace Mz::Test {

/// A stream of class `Stream` that reads `bytes`.
template <class Stream>
struct Reading {
    explicit Reading(std::string_view bytes) : source(std::string(bytes)) {}

    /// Reads the bytes that are left.
    std::string rest() { return {std::istreambuf_iterator<char>(source.rdbuf()), {}}; }

    std::istringstream source;
    QrInBuffer buffer{&source};
    Stream stream{&buffer};
};

/// A stream of class `Stream` that writes to a string.
template <class Stream>
struct Writing {
    std::string bytes() const { return sink.str(); }

    std::ostringstream sink;
    QrOutBuffer buffer{&sink};
    Stream stream{&buffer};
};

/// Returns what `write` writes to a new stream of class `Stream`.
template <class Stream, class Work>
std::string written(Work&& write) {
    Writing<Stream> out;
    write(out.stream);
    return out.bytes();
}

/// Returns the bytes of a text such as "00 FF 41".
inline std::string fromHex(std::string_view digits) {
    const auto value = [](char c) { return c <= '9' ? c - '0' : c - 'A' + 10; };
    std::string bytes;
    for (std::size_t at = 0; at + 1 < digits.size(); at += 3)
        bytes += static_cast<char>(value(digits[at]) * 16 + value(digits[at + 1]));
    return bytes;
}

inline std::string toHex(std::string_view bytes) {
    constexpr std::string_view symbols = "0123456789ABCDEF";
    std::string digits;
    for (const char byte : bytes) {
        const auto code = static_cast<unsigned char>(byte);
        if (!digits.empty())
            digits += ' ';
        digits += symbols[code / 16];
        digits += symbols[code % 16];
    }
    return digits;
}

} // namespace Mz::Test
