// SPDX-License-Identifier: BSL-1.0
// {fmt}: text into its buffer, as its documentation recommends for speed, and one write of that.
#include "peers/registration.h"
#include "peers/values.h"

#include <fmt/compile.h>
#include <fmt/format.h>
#include <iterator>

namespace Mz::Benchmarks {

namespace {

template <class T>
void write(benchmark::State& state) {
    fmt::memory_buffer buffer;
    writeTextOfPeer<T>(state, [&buffer](std::ostream& out, const std::vector<T>& values) {
        buffer.clear();
        for (const T value : values) {
            if constexpr (std::is_floating_point_v<T>)
                fmt::format_to(std::back_inserter(buffer), FMT_COMPILE("{:.16g} "), value);
            else
                fmt::format_to(std::back_inserter(buffer), FMT_COMPILE("{} "), value);
        }
        out.write(buffer.data(), static_cast<std::streamsize>(buffer.size()));
    });
}

void addPeer(RatioTable& table) {
    table.addPeer("text/intWrite", "fmt", write<int>);
    table.addPeer("text/doubleWrite", "fmt", write<double>);
}

const PeerRegistration registration(addPeer);

} // namespace

} // namespace Mz::Benchmarks
