// SPDX-License-Identifier: BSL-1.0
// Reads the answer of a probing child process: the component library may have written it.
//
// Input: whether the rest is what arrives, if odd, or a sequence of messages.
#include "components/componentTools/probing/probeAnswer.h"
#include "fuzz/frames.h"

namespace {

using namespace Mz::Tools;

/// Returns the answer as a correct child process writes it.
std::string encoded(const ProbeAnswer& answer) {
    std::string bytes = encodeStage(answer.stage);
    if (answer.fault)
        bytes += encodeFault(answer.fault->verdict, answer.fault->subject, answer.fault->words);
    if (answer.description)
        bytes += encodeDescription(*answer.description);
    return bytes;
}

} // namespace

int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    using namespace Mz;
    Fuzz::Input input(data, size);
    const bool framed = input.byte() % 2 == 0;
    const ProbeAnswer answer = decodeAnswer(Fuzz::arriving(input, framed));
    const std::string bytes = encoded(answer);
    const ProbeAnswer again = decodeAnswer(bytes);
    Fuzz::expect(!again.garbled, "what was understood can be said");
    Fuzz::expectSame(encoded(again), bytes, "what is said is understood");
    return 0;
}
