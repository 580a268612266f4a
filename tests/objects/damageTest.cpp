// SPDX-License-Identifier: BSL-1.0
// Tests files that were cut or changed at any place: an exception, bounded memory, and no partial
// objects.
#include "tests/objects/support.h"

#include "tests/mesh/allocationCount.h"

#include <random>

namespace {

using namespace Mz;
using namespace Mz::Test;

/// The memory that reading `size` bytes may allocate in total. On Windows, only this program's own.
std::size_t allowance(std::size_t size) {
    return 64 * 1024 + 400 * size;
}

template <class Stream>
class Damaged : public ObjectsOn<Stream> {
  protected:
    /// Returns several graphs on one stream, with cycles, shared objects and null. The last graph
    /// is an object that the stream already knows.
    static std::string graphs() {
        const QrPtr<Node> shared = Objects::node(12);
        std::vector<QrPtr<Node>> links{shared};
        for (int number = 0; number < 9; ++number)
            links.push_back(Objects::node(number, {shared, nullptr}));
        const QrPtr<Node> root = Objects::node(1, links);
        shared->links = {root, shared};
        Saving<Stream> out;
        out.stream << root.get() << static_cast<const QrCastable*>(nullptr);
        out.stream << Objects::node(200, {shared}).get() << root->links.back().get();
        unlink(root);
        return out.bytes();
    }

    static constexpr int graphCount = 4;

    /// Reads the graphs and returns how many were read before the failure.
    static int readAll(std::string_view bytes, std::string& reason) {
        forgetNotes(); // The journal allocates memory too.
        Loading<Stream> in(bytes);
        std::vector<QrPtr<Node>> read;
        int count = 0;
        try {
            for (; count < graphCount; ++count) {
                read.push_back(in.node());
                in.finish();
            }
        } catch (const QrStreamEx::ExReadObject& failure) {
            reason = failure.getReason();
        }
        for (const QrPtr<Node>& node : read)
            unlink(node);
        return count;
    }
};
TYPED_TEST_SUITE(Damaged, StreamKinds);

TYPED_TEST(Damaged, FilesCutAnywhereAreNoticed) {
    const std::string bytes = this->graphs();
    const int before = this->alive();
    std::string reason;
    EXPECT_EQ(this->readAll(bytes, reason), this->graphCount);
    EXPECT_EQ(reason, "");
    int most = 0;
    for (std::size_t length = 0; length < bytes.size(); ++length) {
        SCOPED_TRACE(length);
        const std::size_t allocated = Meshes::allocatedBytes();
        reason.clear();
        const int whole = this->readAll(std::string_view(bytes).substr(0, length), reason);
        EXPECT_LT(whole, this->graphCount);
        EXPECT_GE(whole, most); // More bytes must not give fewer objects.
        most = whole;
        EXPECT_TRUE(reason.starts_with("byte ") || reason.starts_with("unknown position: "))
            << reason;
        EXPECT_LT(Meshes::allocatedBytes() - allocated, allowance(length));
        EXPECT_EQ(this->alive(), before);
    }
    EXPECT_EQ(most, this->graphCount - 1);
}

TYPED_TEST(Damaged, FilesWithAnyByteChangedGiveAnObjectOrAnException) {
    const std::string bytes = this->graphs();
    const int before = this->alive();
    std::mt19937 random(20240607);
    int failures = 0;
    for (std::size_t at = 0; at < bytes.size(); ++at)
        for (int round = 0; round < 12; ++round) {
            std::string damaged = bytes;
            damaged[at] = round < 8 ? static_cast<char>(bytes[at] ^ (1 << round))
                                    : static_cast<char>(random() % 256);
            const std::size_t allocated = Meshes::allocatedBytes();
            std::string reason;
            failures += this->readAll(damaged, reason) < this->graphCount ? 1 : 0;
            ASSERT_LT(Meshes::allocatedBytes() - allocated, allowance(bytes.size()))
                << at << ' ' << round << ' ' << reason;
            ASSERT_EQ(this->alive(), before) << at;
        }
    EXPECT_GT(failures, static_cast<int>(bytes.size()));
}

TYPED_TEST(Damaged, FilesWithForeignPiecesGiveAnObjectOrAnException) {
    const std::string bytes = this->graphs();
    const int before = this->alive();
    std::mt19937 random(99);
    const std::string pieces[] = {std::string(4, '\0'),
                                  std::string("\0\0\0\1", 4),
                                  "\xFF\xFF\xFF\xFF",
                                  " 4294967295 ",
                                  "\n",
                                  "",
                                  "-1",
                                  "1 ",
                                  "0",
                                  std::string("\x7F\xFF\xFF\xFF", 4)};
    for (int round = 0; round < 4000; ++round) {
        std::string damaged = bytes;
        for (auto changes = random() % 3 + 1; changes > 0; --changes)
            damaged.replace(random() % damaged.size(), random() % 12,
                            pieces[random() % std::size(pieces)]);
        const std::size_t allocated = Meshes::allocatedBytes();
        std::string reason;
        this->readAll(damaged, reason);
        ASSERT_LT(Meshes::allocatedBytes() - allocated, allowance(damaged.size()));
        ASSERT_EQ(this->alive(), before);
    }
}

TYPED_TEST(Damaged, CountsThatClaimMoreThanThereIsCostNothing) {
    for (const int claim : {0, 1}) {
        Saving<TypeParam> out;
        out.stream << 1U << nodeUid << 3U << 1;
        if (claim == 0) {
            out.stream << 0xFFFFFFFFU << 65U; // characters of the name
        } else {
            QrWriteExactText(out.stream, L"");
            out.stream << true << 0.5 << 0xFFFFFFFFU << 0U; // links
        }
        const std::string bytes = out.bytes();
        const std::size_t allocated = Meshes::allocatedBytes();
        std::string reason;
        EXPECT_EQ(this->readAll(bytes, reason), 0);
        EXPECT_LT(Meshes::allocatedBytes() - allocated, allowance(bytes.size()));
    }
}

TYPED_TEST(Damaged, StringsThatClaimMoreThanThereIsCostTheirChunkAtMost) {
    Saving<TypeParam> out;
    out.stream << 1U << stringUid << 1U << 6 << 2147483647 << 65;
    const std::size_t allocated = Meshes::allocatedBytes();
    Loading<TypeParam> in(out.bytes());
    readFailure([&] { in.object(); });
    EXPECT_LT(Meshes::allocatedBytes() - allocated, 2U * 1024 * 1024);
}

} // namespace
