// SPDX-License-Identifier: BSL-1.0
// Loads stored objects of the test classes, with and without faults, and stores them again.
//
// Input: the kind of stream, the stored objects. With bit 7 of the kind: the depth of a chain of
// objects inside one another, and changes of single bytes of it.
#include "fuzz/fuzz.h"
#include "tests/objects/objectStreams.h"
#include "tests/streams/streamKinds.h"
#include "tests/support/journal.h"

#include <algorithm>
#include <optional>
#include <set>
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

/// Returns how deeply nodes were inside one another when they were stored: each new one was stored
/// where it was first referred to.
int nesting(const QrPtr<Node>& node, std::set<const Node*>& seen) {
    if (!node || !seen.insert(node.get()).second)
        return 0;
    int deepest = 0;
    for (const QrPtr<Node>& link : node->links)
        deepest = std::max(deepest, nesting(link, seen));
    return deepest + 1;
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
        std::set<const Node*> seen;
        Fuzz::expect(nesting(node, seen) <= QrMaximumObjectDepth, "nested no deeper than allowed");
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

/// Returns a chain of nodes, each inside the one before, some of them deeper than is allowed, with
/// some bytes changed. Mutations alone do not nest objects deeply.
template <class Stream>
std::string changedChain(Fuzz::Input& input) {
    unsigned int depth = 1 + input.byte();
    depth += 2 * input.byte() % 256;
    std::string bytes = writtenChain<Stream>(depth);
    for (std::string_view change; (change = input.take(3)).size() == 3;) {
        const auto high = static_cast<unsigned char>(change[0]);
        const auto low = static_cast<unsigned char>(change[1]);
        bytes[(std::size_t{high} << 8 | low) % bytes.size()] = change[2];
    }
    return bytes;
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

template <class Stream>
void loadFrom(Fuzz::Input& input, bool nested) {
    if (nested)
        load<Stream>(changedChain<Stream>(input));
    else
        load<Stream>(input.rest());
}

} // namespace

int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    QrGetComponentManager()->initialize(MZ_BUILD_PATH L"/components/objects");
    forgetNotes(); // The classes report events, for other tests.
    Fuzz::Input input(data, size);
    const unsigned int kind = input.byte();
    const bool nested = kind & 0x80;
    switch (kind % 4) {
    case 0: loadFrom<QrBinaryStream>(input, nested); break;
    case 2: loadFrom<BaseStream>(input, nested); break;
    default: loadFrom<QrTextStream>(input, nested); break;
    }
    return 0;
}
