// SPDX-License-Identifier: BSL-1.0
// Stored objects: of classes that do what is asked of them, and of classes that do not.
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

/// Whether a class may be in it that lets go of objects it has read, and does not write them again.
/// If such an object is part of a circle, nobody can undo that any more.
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

/// The objects in `bytes`, stored again; nothing when they cannot be loaded, or stored as they are.
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
        unlink(node); // Circles of references never end by themselves.
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
    forgetNotes(); // The classes take notes of what they go through, for other tests.
    Fuzz::Input input(data, size);
    switch (input.byte() % 4) {
    case 0: load<QrBinaryStream>(input.rest()); break;
    case 2: load<BaseStream>(input.rest()); break;
    default: load<QrTextStream>(input.rest()); break;
    }
    return 0;
}
