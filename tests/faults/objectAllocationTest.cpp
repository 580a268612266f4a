// SPDX-License-Identifier: BSL-1.0
/// Tests saving and loading of whole objects while allocations fail.
#include "tests/objects/support.h"
#include "tests/support/failingAllocations.h"

using namespace Mz;
using namespace Mz::Test;

namespace {

template <class Stream>
class ObjectsWithoutMemory : public ObjectsOn<Stream> {
  protected:
    static QrPtr<Node> graph() {
        const QrPtr<Node> shared = Objects::node(3);
        const QrPtr<Node> root =
            Objects::node(1, {shared, Objects::node(2, {shared, nullptr}), shared});
        root->name = std::wstring(100, L'n');
        return root;
    }
};
TYPED_TEST_SUITE(ObjectsWithoutMemory, StreamKinds);

/// A medium that allocates nothing.
class Block final : public std::streambuf {
  public:
    Block() { setp(bytes, bytes + sizeof bytes); }
    std::string_view content() const { return {bytes, static_cast<std::size_t>(pptr() - bytes)}; }

  private:
    char bytes[65536];
};

TYPED_TEST(ObjectsWithoutMemory, AreSavedWhollyOrNothingFollows) {
    const QrPtr<Node> root = this->graph();
    const std::string whole = saved<TypeParam>(root.get());
    const int failures = failEachAllocation([&](Attempt& attempt) {
        Block block;
        std::ostream sink(&block);
        QrOutBuffer buffer(&sink);
        bool done = false;
        {
            QrObjectOutBuffer objects(&buffer);
            TypeParam stream(&objects);
            done = attempt.run([&] { stream << root.get(); });
            EXPECT_EQ(done, !attempt.failed);
            if (!done) {
                // After a part of the object only its separator may follow; after nothing, all.
                const std::string accepted(block.content());
                EXPECT_TRUE(whole.starts_with(accepted));
                EXPECT_LT(accepted.size(), whole.size());
                if (accepted.empty()) {
                    stream << root.get();
                    EXPECT_EQ(block.content(), whole);
                } else {
                    EXPECT_THROW(stream << root.get(), QrStreamEx::ExWriteObject);
                    const std::string_view content = block.content();
                    EXPECT_TRUE(content.starts_with(accepted));
                    EXPECT_EQ(content.find_first_not_of(" \n", accepted.size()),
                              std::string_view::npos);
                }
            }
        }
        EXPECT_TRUE(!done || block.content() == whole);
    });
    EXPECT_GE(failures, leastFailures(5));
    EXPECT_EQ(saved<TypeParam>(root.get()), whole);
}

TYPED_TEST(ObjectsWithoutMemory, AreLoadedWhollyOrNotAtAll) {
    const std::string whole = saved<TypeParam>(this->graph().get()) + " ";
    const int before = this->alive();
    const int failures = failEachAllocation([&](Attempt& attempt) {
        {
            Loading<TypeParam> in(whole);
            QrPtr<Node> read;
            bool refused = false;
            const bool done = attempt.run([&] {
                try {
                    read = in.node();
                    in.finish();
                } catch (const QrStreamEx::ExReadObject&) {
                    refused = true;
                }
            });
            EXPECT_EQ(done && !refused, !attempt.failed);
        }
        EXPECT_EQ(this->alive(), before);
        Loading<TypeParam> again(whole);
        const QrPtr<Node> read = again.node();
        again.finish();
        EXPECT_EQ(read->links.size(), 3U);
        EXPECT_EQ(read->name.size(), 100U);
    });
    EXPECT_GE(failures, leastFailures(10));
    EXPECT_EQ(this->alive(), before);
}

} // namespace
