// SPDX-License-Identifier: BSL-1.0
// Loads stored objects of the test classes, with and without faults, and stores them again.
//
// Input: the kind of stream, the stored objects.
#include "fuzz/fuzz.h"
#include "tests/objects/objectStreams.h"
#include "tests/streams/streamKinds.h"
#include "tests/support/journal.h"

#include <optional>
#include <stdexcept>

namespace {

using namespace Mz;
using namespace Mz::Test;

/// Returns whether `bytes` may contain a class that drops objects which it has read. If such an
/// object is part of a cycle, its memory leaks, and the target could not tell that from a fault.
bool mayForget(std::string_view bytes) {
    for (const std::uint32_t word : {carelessUid.w0, misleadingUid.w0}) {
        const char binary[] = {static_cast<char>(word >> 24), static_cast<char>(word >> 16),
                               static_cast<char>(word >> 8), static_cast<char>(word)};
        if (bytes.find({binary, sizeof binary}) != std::string_view::npos ||
            bytes.find(std::to_string(word)) != std::string_view::npos)
            return true;
    }
    return false;
}

/// Loads the objects in `bytes` and returns them stored again; nothing if either of it fails.
template <class Stream>
std::optional<std::string> storedAgain(std::string_view bytes) {
    QrPtr<Node> node;
    try {
        Loading<Stream> in(bytes);
        const QrRef<QrCastable> object = in.object();
        if (mayForget(bytes))
            return std::nullopt;
        in.finish();
        node = queryCast<Node>(object.get());
        std::string result = saved<Stream>(object.get());
        unlink(node); // Otherwise cycles of references leak.
        return result;
    } catch (const ExBase&) {
    } catch (const std::runtime_error& failure) {
        Fuzz::expect(std::strcmp(failure.what(), "the builder's own") == 0, "a stated exception");
    }
    unlink(node);
    return std::nullopt;
}

template <class Stream>
void load(std::string_view content) {
    const std::optional<std::string> once = storedAgain<Stream>(content);
    if (!once)
        return;
    const std::optional<std::string> twice = storedAgain<Stream>(*once);
    Fuzz::expect(twice.has_value(), "what was stored can be loaded");
    Fuzz::expectSame(*once, *twice, "what was loaded is what was stored");
}

} // namespace

int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    QrGetComponentManager()->initialize(MZ_BUILD_PATH L"/components/objects");
    forgetNotes(); // The classes report events, for other tests.
    Fuzz::Input input(data, size);
    switch (input.byte() % 4) {
    case 0: load<QrBinaryStream>(input.rest()); break;
    case 2: load<BaseStream>(input.rest()); break;
    default: load<QrTextStream>(input.rest()); break;
    }
    return 0;
}
