// SPDX-License-Identifier: BSL-1.0
/// The works of a peer with values: the same values as the library's, on the same standard streams.
#pragma once

#include "streamWork.h"

#include <charconv>
#include <istream>
#include <ostream>
#include <string>
#include <vector>

namespace Mz::Benchmarks {

/// Returns whether `text` begins with the text values. The text may have other white space than
/// ours.
template <class T>
bool isTextOfValues(const std::string& text) {
    const char* at = text.data();
    const char* const end = at + text.size();
    for (const T expected : textValues<T>()) {
        T value{};
        while (at != end && (*at == ' ' || *at == '\n'))
            ++at;
        at = std::from_chars(at, end, value).ptr;
        if (value != expected)
            return false;
    }
    return true;
}

/// Measures `write`, which writes values as text with white space after each.
template <class T, class Write>
void writeTextOfPeer(benchmark::State& state, const Write& write) {
    const std::vector<T> values = randomValues<T>(textCount);
    std::ostringstream out;
    for (auto iteration : state) {
        static_cast<void>(iteration);
        out.seekp(0);
        write(out, values);
    }
    if (!isTextOfValues<T>(out.str()))
        state.SkipWithError("something else was written");
}

/// Measures `read`, which reads values from the text that the library writes.
template <class T, class Read>
void readTextOfPeer(benchmark::State& state, const Read& read) {
    readRepeatedly(state, valuesIn<T, QrTextStream>(textCount), textValues<T>(), read);
}

/// Measures `write`, which writes single binary values in the form of the peer.
template <class T, class Write>
void writeBinaryOfPeer(benchmark::State& state, const Write& write, int count = valueCount) {
    const std::vector<T> values = randomValues<T>(count);
    std::ostringstream expected;
    write(expected, values);
    if (expected.str().size() < values.size() * sizeof(T))
        return state.SkipWithError("too little was written");
    writeRepeatedly(state, expected.str(), [&](std::ostream& out) { write(out, values); });
}

/// Measures `read`, which reads single binary values.
///
/// \param content  the values in the form of the peer
template <class T, class Read>
void readBinaryOfPeer(benchmark::State& state, const std::string& content, const Read& read,
                      int count = valueCount) {
    readRepeatedly(state, content, randomValues<T>(count), read);
}

} // namespace Mz::Benchmarks
