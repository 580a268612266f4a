// SPDX-License-Identifier: BSL-1.0
/// Reads one content through the library's short cuts, and through all calls of a standard stream,
/// where the library cannot take them. Both must have the same result.
#pragma once

#include "fuzz/fuzz.h"
#include "tests/streams/streamKinds.h"

#include <iterator>
#include <sstream>

namespace Mz::Fuzz {

using Test::BaseStream;
using Test::ForeignInput;
using Test::WatchedBuffer;

/// Returns all observable results of `work`: its texts, the stream's state, and the unread bytes.
template <class Stream, class Buffer, class IO, class Work>
std::string readingBy(std::string_view content, const Work& work) {
    Buffer buffer(std::string(content), std::ios::in | std::ios::out);
    std::istream source(&buffer);
    IO io(&source);
    std::string told;
    {
        Stream stream(&io);
        told += outcomeOf([&] { return work(stream, io, told); });
    }
    const std::string state = std::to_string(source.rdstate());
    return told + "|" + state + "|" + std::string(std::istreambuf_iterator<char>(&buffer), {});
}

/// `work` gets the stream, its IO, and a text to which it appends its results. What it returns is
/// appended last.
template <class Stream, class Work>
void expectSameReading(std::string_view content, const Work& work) {
    const auto direct = readingBy<Stream, std::stringbuf, QrInBuffer>(content, work);
    const auto watched = readingBy<Stream, WatchedBuffer, QrInBuffer>(content, work);
    const auto foreign = readingBy<Stream, std::stringbuf, ForeignInput>(content, work);
    expectSame(direct, watched, "a watched buffer gives the same");
    expectSame(direct, foreign, "a foreign IO gives the same");
}

} // namespace Mz::Fuzz
