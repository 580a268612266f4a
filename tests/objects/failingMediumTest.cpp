// SPDX-License-Identifier: BSL-1.0
// Tests objects on media that fail at the n-th call, for every n.
#include "tests/support/failingMedium.h"
#include "tests/objects/support.h"

namespace {

using namespace Mz;
using namespace Mz::Test;

template <class Stream>
class FailingMediumUnder : public ObjectsOn<Stream> {
  protected:
    static QrPtr<Node> graph() {
        const QrPtr<Node> shared = Objects::node(3);
        return Objects::node(1, {shared, Objects::node(2, {shared, nullptr}), shared});
    }
};
TYPED_TEST_SUITE(FailingMediumUnder, StreamKinds);

TYPED_TEST(FailingMediumUnder, AWriterRaisesWriteErrorAndNothingFollows) {
    const QrPtr<Node> root = this->graph();
    const std::string whole = saved<TypeParam>(root.get());
    for (const bool throwing : {false, true}) {
        int calls = 0;
        for (bool failed = true; failed; ++calls) {
            SCOPED_TRACE(calls);
            FailingMedium medium({}, calls, throwing);
            std::ostream sink(&medium);
            QrOutBuffer buffer(&sink);
            QrObjectOutBuffer objects(&buffer);
            TypeParam stream(&objects);
            bool thrown = false;
            try {
                stream << root.get();
            } catch (const QrStreamEx::ExWriteError&) {
                thrown = true;
            }
            failed = medium.failed();
            EXPECT_EQ(thrown, failed);
            EXPECT_TRUE(whole.starts_with(medium.accepted));
            if (failed) {
                const std::string accepted = medium.accepted;
                EXPECT_THROW(stream << root.get(), QrStreamEx::ExWriteObject);
                EXPECT_EQ(medium.accepted, accepted);
                // The bytes that were accepted are not a complete object.
                Loading<TypeParam> in(accepted);
                readFailure([&] { in.object(); });
            }
        }
        EXPECT_GT(calls, 20);
    }
}

TYPED_TEST(FailingMediumUnder, AReaderRaisesReadObjectAndGivesNothing) {
    const std::string whole = saved<TypeParam>(this->graph().get()) + " ";
    const int before = this->alive();
    for (const bool throwing : {true, false}) {
        bool failed = true;
        int calls = 0;
        for (; failed; ++calls) {
            SCOPED_TRACE(calls);
            FailingMedium medium(whole, calls, throwing);
            std::istream source(&medium);
            QrInBuffer buffer(&source);
            QrObjectInBuffer objects(&buffer);
            TypeParam stream(&objects);
            QrRef<QrCastable> read;
            bool thrown = false;
            try {
                read = stream.readObject(&Node::uid, nullptr, nullptr);
            } catch (const QrStreamEx::ExReadObject& failure) {
                EXPECT_NE(std::string(failure.getReason()).find("position: "), std::string::npos);
                thrown = true;
            }
            failed = medium.failed();
            EXPECT_EQ(static_cast<bool>(read), !thrown);
            if (throwing || !failed) {
                EXPECT_EQ(thrown, failed);
            }
        }
        EXPECT_GT(calls, 100);
    }
    EXPECT_EQ(this->alive(), before);
}

} // namespace
