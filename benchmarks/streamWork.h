// SPDX-License-Identifier: BSL-1.0
/// Repeats work on the same standard stream and checks its result. The library and its peers are
/// measured by the same functions.
#pragma once

#include "streamValues.h"

#include "components/componentManager/binaryStream.h"
#include "components/componentManager/textStream.h"

#include <benchmark/benchmark.h>

#include <cstring>
#include <map>
#include <sstream>
#include <string>
#include <vector>

namespace Mz::Benchmarks {

/// Returns what `write` writes to a standard stream.
template <class Write>
std::string written(const Write& write) {
    std::ostringstream out;
    write(out);
    return out.str();
}

/// Returns `randomValues` as `Stream` writes them, the same text at each call.
template <class T, class Stream>
const std::string& valuesIn(int count) {
    static std::map<int, std::string> texts;
    std::string& text = texts[count];
    if (text.empty()) {
        const std::vector<T> values = randomValues<T>(count);
        text = written([&](std::ostream& out) {
            QrOutBuffer io(&out);
            Stream stream(&io);
            for (const T value : values)
                stream << value;
        });
    }
    return text;
}

/// Repeats `work` on the same output from its beginning, so that no memory is allocated. At the end
/// checks that the output is `expected`.
template <class Work>
void writeRepeatedly(benchmark::State& state, const std::string& expected, const Work& work) {
    std::ostringstream out;
    for (auto iteration : state) {
        static_cast<void>(iteration);
        out.seekp(0);
        work(out);
    }
    if (out.str() != expected)
        state.SkipWithError("something else was written");
}

/// Repeats `work` on the same input from its beginning. At the end checks that the values that
/// `work` read are `expected`.
template <class T, class Work>
void readRepeatedly(benchmark::State& state, const std::string& content,
                    const std::vector<T>& expected, const Work& work) {
    std::istringstream in(content);
    std::vector<T> values(expected.size());
    for (auto iteration : state) {
        static_cast<void>(iteration);
        in.clear();
        in.seekg(0);
        work(in, values);
    }
    if (std::memcmp(values.data(), expected.data(), sizeof(T) * values.size()) != 0)
        state.SkipWithError("something else was read");
}

/// Returns the values that are read back from text: 16 digits do not represent every `double`
/// exactly.
template <class T>
const std::vector<T>& textValues() {
    static const std::vector<T> read = [] {
        std::istringstream in(valuesIn<T, QrTextStream>(textCount));
        std::vector<T> values(textCount);
        for (T& value : values)
            in >> value;
        return values;
    }();
    return read;
}

} // namespace Mz::Benchmarks
