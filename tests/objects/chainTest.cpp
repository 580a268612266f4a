// Chains of objects that are longer than the stack is deep.
#include "tests/objects/support.h"

#include <utility>

namespace {

using namespace Mz;
using namespace Mz::Test;

template <class Stream>
class Chain : public ObjectsOn<Stream> {
  protected:
    /// Far more than could be freed from inside one another.
    static constexpr int length = 200'000;

    static QrPtr<Node> holder(int number, std::vector<QrPtr<Node>> links = {}) {
        QrPtr<Node> result = Objects::make(holderUid);
        result->number = number;
        result->links = std::move(links);
        return result;
    }

    /// Siblings, each of which holds the one before.
    static std::vector<QrPtr<Node>> siblings() {
        std::vector<QrPtr<Node>> all{holder(0)};
        all.reserve(length);
        while (all.size() < length)
            all.push_back(holder(static_cast<int>(all.size()), {all.back()}));
        return all;
    }

    /// Drops the last first, so that each is freed by itself.
    static void dropFromTheEnd(std::vector<QrPtr<Node>> all) {
        while (!all.empty())
            all.pop_back();
    }

    static std::string savedSiblings() {
        std::vector<QrPtr<Node>> all = siblings();
        const QrPtr<Node> root = holder(-1, all);
        const std::string bytes = saved<Stream>(root.get());
        root->links.clear();
        dropFromTheEnd(std::move(all));
        return bytes;
    }
};
TYPED_TEST_SUITE(Chain, StreamKinds);

TYPED_TEST(Chain, OfSiblingsIsFreedInALoopByTheLoader) {
    const std::string bytes = this->savedSiblings();
    const int before = this->alive();
    {
        Loading<TypeParam> in(bytes);
        EXPECT_TRUE(in.object());
        EXPECT_EQ(this->alive(), before + this->length + 1);
    }
    EXPECT_EQ(this->alive(), before);
}

TYPED_TEST(Chain, OfObjectsSideBySideIsFreedInALoopByTheLoader) {
    const int before = this->alive();
    {
        Saving<TypeParam> out;
        std::vector<QrPtr<Node>> all = this->siblings();
        for (const QrPtr<Node>& each : all)
            out.stream << each.get();
        this->dropFromTheEnd(std::move(all));
        Loading<TypeParam> in(out.bytes());
        for (int index = 0; index < this->length; ++index)
            ASSERT_TRUE(in.object());
    }
    EXPECT_EQ(this->alive(), before);
}

TYPED_TEST(Chain, IsFreedInALoopWhenTheLoadFailsHalfWay) {
    const std::string bytes = this->savedSiblings();
    const int before = this->alive();
    for (const std::size_t size : {bytes.size() - 1, bytes.size() / 2}) {
        Loading<TypeParam> in(std::string_view(bytes).substr(0, size));
        readFailure([&] { in.object(); });
        EXPECT_GT(this->alive(), before + this->length / 3);
    }
    EXPECT_EQ(this->alive(), before);
}

TYPED_TEST(Chain, IsFreedInALoopByTheSaverThatOutlivesIt) {
    const int before = this->alive();
    {
        Saving<TypeParam> out;
        out.stream << this->holder(-1, this->siblings()).get();
        EXPECT_EQ(this->alive(), before + this->length + 1);
    }
    EXPECT_EQ(this->alive(), before);
}

} // namespace
