// SPDX-License-Identifier: BSL-1.0
/// One content, read past the standard stream where the library can, and through every call where
/// it cannot know who watches: both must come to the same.
#pragma once

#include "fuzz/fuzz.h"
#include "tests/streams/streamKinds.h"

#include <iterator>
#include <sstream>

namespace Mz::Fuzz {

using Test::BaseStream;
using Test::ForeignInput;
using Test::WatchedBuffer;

/// All that can be seen of `work` on a stream: what it tells, what is left unread, and the state.
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

/// `work` takes the stream, its IO, and a text to which it adds what it sees while it goes; what it
/// returns comes last.
template <class Stream, class Work>
void expectSameReading(std::string_view content, const Work& work) {
    const auto direct = readingBy<Stream, std::stringbuf, QrInBuffer>(content, work);
    const auto watched = readingBy<Stream, WatchedBuffer, QrInBuffer>(content, work);
    const auto foreign = readingBy<Stream, std::stringbuf, ForeignInput>(content, work);
    expectSame(direct, watched, "a watched buffer gives the same");
    expectSame(direct, foreign, "a foreign IO gives the same");
}

} // namespace Mz::Fuzz
