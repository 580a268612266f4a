// SPDX-License-Identifier: BSL-1.0
/// Streams of whole objects in memory.
#pragma once

#include "components/componentManager/binaryStream.h"
#include "components/componentManager/componentImp.h"
#include "components/componentManager/textStream.h"
#include "components/objectIO/objectIO.h"
#include "tests/objects/components/classes.h"

#include <sstream>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

namespace Mz::Test {

/// Writes objects to memory.
template <class Stream>
struct Saving {
    std::string bytes() const { return sink.str(); }

    std::ostringstream sink;
    QrOutBuffer buffer{&sink};
    QrObjectOutBuffer objects{&buffer};
    Stream stream{&objects};
};

/// Reads objects from memory.
template <class Stream>
struct Loading {
    explicit Loading(std::string_view bytes) : source(std::string(bytes)) {}

    QrRef<QrCastable> object(const QrUid* id = nullptr) {
        return stream.readObject(id, nullptr, nullptr);
    }
    QrPtr<Node> node() { return queryCast<Node>(object(&Node::uid).get()); }
    void finish() {
        QrPostLoadList list;
        stream.transfer(list);
        list.loadFinished();
    }

    std::istringstream source;
    QrInBuffer buffer{&source};
    QrObjectInBuffer objects{&buffer};
    Stream stream{&objects};
};

/// Returns the bytes of one object.
template <class Stream>
std::string saved(const QrCastable* object) {
    Saving<Stream> out;
    out.stream << object;
    return out.bytes();
}

/// Returns a chain of `depth` nodes, each inside the one before. It is written by hand, because a
/// writer refuses more than the largest depth.
template <class Stream>
std::string writtenChain(unsigned int depth) {
    Saving<Stream> out;
    for (unsigned int number = 1; number <= depth; ++number) {
        out.stream << number << nodeUid << 3U << 1;
        QrWriteExactText(out.stream, L"");
        out.stream << true << 0.5 << (number < depth ? 1U : 0U);
    }
    for (unsigned int number = depth; number > 0; --number)
        out.stream << (0x454F424AU ^ number);
    return out.bytes();
}

/// Clears the links of all nodes that can be reached, so that cycles are freed.
inline void unlink(const QrPtr<Node>& start) {
    std::vector<QrPtr<Node>> found{start};
    while (!found.empty()) {
        const QrPtr<Node> next = found.back();
        found.pop_back();
        if (!next)
            continue;
        const std::vector<QrPtr<Node>> links = std::exchange(next->links, {});
        found.insert(found.end(), links.begin(), links.end());
    }
}

} // namespace Mz::Test
