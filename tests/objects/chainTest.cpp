// SPDX-License-Identifier: BSL-1.0
// Tests that the library frees long chains of objects in a loop: recursion would overflow the
// stack.
#include "tests/objects/support.h"

#include <utility>

namespace {

using namespace Mz;
using namespace Mz::Test;

class Chain : public Objects {
  protected:
    /// Long enough to overflow the stack if each object freed the next one.
    static constexpr int length = 200'000;

    static QrPtr<Node> holder(int number, std::vector<QrPtr<Node>> links = {}) {
        QrPtr<Node> result = make(holderUid);
        result->number = number;
        result->links = std::move(links);
        return result;
    }

    /// Returns objects each of which owns the one before it.
    static std::vector<QrPtr<Node>> siblings() {
        std::vector<QrPtr<Node>> all{holder(0)};
        all.reserve(length);
        while (all.size() < length)
            all.push_back(holder(static_cast<int>(all.size()), {all.back()}));
        return all;
    }

    /// Releases the last object first, so that no release frees more than one object.
    static void dropFromTheEnd(std::vector<QrPtr<Node>> all) {
        while (!all.empty())
            all.pop_back();
    }

    static std::string savedSiblings() {
        std::vector<QrPtr<Node>> all = siblings();
        const QrPtr<Node> root = holder(-1, all);
        const std::string bytes = saved<QrBinaryStream>(root.get());
        root->links.clear();
        dropFromTheEnd(std::move(all));
        return bytes;
    }
};
TEST_F(Chain, OfSiblingsIsFreedInALoopByTheLoader) {
    const std::string bytes = savedSiblings();
    const int before = alive();
    {
        Loading<QrBinaryStream> in(bytes);
        EXPECT_TRUE(in.object());
        EXPECT_EQ(alive(), before + length + 1);
    }
    EXPECT_EQ(alive(), before);
}

TEST_F(Chain, OfObjectsSideBySideIsFreedInALoopByTheLoader) {
    const int before = alive();
    {
        Saving<QrBinaryStream> out;
        std::vector<QrPtr<Node>> all = siblings();
        for (const QrPtr<Node>& each : all)
            out.stream << each.get();
        dropFromTheEnd(std::move(all));
        Loading<QrBinaryStream> in(out.bytes());
        for (int index = 0; index < length; ++index)
            ASSERT_TRUE(in.object());
    }
    EXPECT_EQ(alive(), before);
}

TEST_F(Chain, IsFreedInALoopWhenTheLoadFailsHalfWay) {
    const std::string bytes = savedSiblings();
    const int before = alive();
    for (const std::size_t size : {bytes.size() - 1, bytes.size() / 2}) {
        Loading<QrBinaryStream> in(std::string_view(bytes).substr(0, size));
        readFailure([&] { in.object(); });
        EXPECT_GT(alive(), before + length / 3);
    }
    EXPECT_EQ(alive(), before);
}

TEST_F(Chain, IsFreedInALoopByTheSaverThatOutlivesIt) {
    const int before = alive();
    {
        Saving<QrBinaryStream> out;
        out.stream << holder(-1, siblings()).get();
        EXPECT_EQ(alive(), before + length + 1);
    }
    EXPECT_EQ(alive(), before);
}

} // namespace
