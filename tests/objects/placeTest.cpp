// SPDX-License-Identifier: BSL-1.0
// Tests that the positions in the reasons of failures, which are counted, are those that the medium
// would have told, and that the medium is rarely asked.
#include "tests/objects/places.h"
#include "tests/support/temporaryDirectory.h"

#include <fstream>
#include <sstream>

namespace {

using namespace Mz;
using namespace Mz::Test;
using testing::StartsWith;

TYPED_TEST_SUITE(Place, StreamKinds);

TYPED_TEST(Place, IsTheOneThatTheMediumTells) {
    std::mt19937 engine(20'261);
    int told = 0;
    for (int round = 0; round < 300 && !testing::Test::HasFailure(); ++round) {
        const std::string whole = this->randomObjects(engine);
        for (int damage = 0; damage < 10; ++damage) {
            const std::string bytes = this->damaged(whole, damage % 5 == 0, engine);
            const std::string counted = this->template outcome<QrObjectInBuffer>(bytes);
            EXPECT_EQ(counted, this->template outcome<Asking>(bytes)) << round;
            told += counted.find(": byte ") != std::string::npos;
        }
    }
    EXPECT_GT(told, 1000);
}

TYPED_TEST(Place, IsTheOneThatAFileTells) {
    const TemporaryDirectory folder;
    const std::filesystem::path file = folder.path() / "objects";
    std::mt19937 engine(20'262);
    int told = 0;
    for (int round = 0; round < 60 && !testing::Test::HasFailure(); ++round) {
        const std::string whole = this->randomObjects(engine);
        const std::string bytes = this->damaged(whole, round % 3 == 0, engine);
        std::ofstream(file, std::ios::binary) << bytes;
        for (const std::size_t held : {std::size_t{2}, std::size_t{40}, whole.size() / 2})
            told += this->tellsTheSame(file, 0, held);
    }
    EXPECT_GT(told, 100);
}

TYPED_TEST(Place, IsAskedForAgainAfterTheProgramUsedTheInnerIO) {
    Scripted unknown(unknownUid, 1, [](QrStream&) {});
    Saving<TypeParam> out;
    out.stream << this->node(1).get();
    out.buffer.write("own bytes", 9);
    const std::size_t begin = out.bytes().size();
    out.stream << static_cast<const QrCastable*>(&unknown);
    Loading<TypeParam> in(out.bytes());
    in.object();
    std::string own(9, '\0');
    in.buffer.read(own.data(), 9);
    EXPECT_EQ(own, "own bytes");
    EXPECT_THAT(readFailure([&] { in.object(); }), StartsWith("byte " + std::to_string(begin)));
}

/// Counts the questions for the position.
class CountingBuffer final : public std::stringbuf {
  public:
    using std::stringbuf::stringbuf;
    int asked = 0;

  protected:
    pos_type seekoff(off_type offset, std::ios::seekdir from, std::ios::openmode which) override {
        ++asked;
        return std::stringbuf::seekoff(offset, from, which);
    }
};

class Places : public Objects {};

TEST_F(Places, OfBinaryObjectsAreAskedForOnceForEachOutermostObject) {
    std::vector<QrPtr<Node>> links;
    for (int number = 0; number < 100; ++number)
        links.push_back(node(number, links.empty() ? links : std::vector{links.back()}));
    Saving<QrBinaryStream> out;
    out.stream << node(100, links).get() << node(101, links).get();
    CountingBuffer content(out.bytes());
    std::istream source(&content);
    QrInBuffer buffer(&source);
    QrObjectInBuffer objects(&buffer);
    QrBinaryStream stream(&objects);
    EXPECT_TRUE(stream.readObject(nullptr, nullptr, nullptr));
    EXPECT_EQ(content.asked, 1);
    EXPECT_TRUE(stream.readObject(nullptr, nullptr, nullptr));
    EXPECT_EQ(content.asked, 2);
}

TEST(ObjectInput, PassesEachOperationOn) {
    std::istringstream source(" abcdef");
    QrInBuffer bytes(&source);
    QrObjectInBuffer objects(&bytes);
    objects.skipWhiteSpace(1);
    char letter = 0;
    EXPECT_EQ(objects.readChar(letter), 1);
    EXPECT_EQ(letter, 'a');
    objects.ungetc('a');
    char letters[2]{};
    EXPECT_EQ(objects.readChar(letters, 2, 2), 2);
    EXPECT_EQ(std::string(letters, 2), "ab");
    objects.ungetc(L'b');
    EXPECT_EQ(objects.read(), 'b');
    EXPECT_EQ(objects.seek(5, 0), 5);
    EXPECT_EQ(objects.tell(), 5);
    EXPECT_EQ(objects.read(), 'e');
}

} // namespace
