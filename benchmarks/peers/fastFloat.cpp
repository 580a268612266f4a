// SPDX-License-Identifier: BSL-1.0
// fast_float: one read of all, and its from_chars for each number.
#include "peers/registration.h"
#include "peers/values.h"

#include <fast_float/fast_float.h>

namespace Mz::Benchmarks {

namespace {

void readDoubles(benchmark::State& state) {
    std::vector<char> block(valuesIn<double, QrTextStream>(textCount).size());
    readTextOfPeer<double>(state, [&block](std::istream& in, std::vector<double>& values) {
        in.read(block.data(), static_cast<std::streamsize>(block.size()));
        const char* at = block.data();
        const char* const end = at + block.size();
        for (double& value : values) {
            while (at != end && (*at == ' ' || *at == '\n'))
                ++at;
            at = fast_float::from_chars(at, end, value).ptr;
        }
    });
}

void addPeer(RatioTable& table) {
    table.addPeer("text/doubleRead", "fast_float", readDoubles);
}

const PeerRegistration registration(addPeer);

} // namespace

} // namespace Mz::Benchmarks
