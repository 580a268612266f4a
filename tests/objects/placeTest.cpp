// SPDX-License-Identifier: BSL-1.0
// Tests that the positions in the reasons of failures, which are counted, are those that the medium
// would have told, and that the medium is rarely asked.
#include "tests/objects/support.h"

#include <exception>
#include <random>
#include <sstream>

namespace {

using namespace Mz;
using namespace Mz::Test;
using testing::StartsWith;

/// Counts nothing: a seek makes the IO ask for its position again. Streams take no short way past
/// a derived class.
class Asking final : public QrObjectInBuffer {
  public:
    using QrObjectInBuffer::QrObjectInBuffer;

    int read(void* data, int size) override {
        const int got = QrObjectInBuffer::read(data, size);
        ask();
        return got;
    }
    int read() override {
        const int byte = QrObjectInBuffer::read();
        ask();
        return byte;
    }

  private:
    // After a short read the position cannot be asked for, but was known.
    void ask() {
        if (inner().canSeek())
            seek(0, 1);
    }
};

template <class Stream>
class Place : public ObjectsOn<Stream> {
  protected:
    /// Returns objects that contain others, with values of all forms between them.
    static std::string randomObjects(std::mt19937& engine) {
        const std::wstring letters = L"idbeoidbeoICBWICBW";
        Saving<Stream> out;
        for (int count = 0; count < 3; ++count) {
            const QrPtr<Node> around = Objects::make(holderUid);
            for (int links = 0; links < 3; ++links) {
                const QrPtr<Node> spelled = Objects::make(spelledUid);
                for (int length = 0; length < 6; ++length)
                    spelled->name += letters[engine() % usable];
                around->links.push_back(spelled);
                around->links.push_back(Objects::node(links, {spelled}));
            }
            out.stream << 5 << around.get();
        }
        return out.bytes();
    }

    /// Reads all objects. Returns the number of those that could be read, and why the next could
    /// not.
    template <class IO>
    static std::string outcome(const std::string& bytes) {
        std::istringstream source(bytes);
        QrInBuffer buffer(&source);
        IO objects(&buffer);
        Stream stream(&objects);
        for (int count = 0;; ++count)
            try {
                int number = 0;
                stream >> number;
                unlink(queryCast<Node>(stream.readObject(nullptr, nullptr, nullptr).get()));
            } catch (const ExBase& failure) {
                return std::to_string(count) + ": " + failure.getReason();
            } catch (const std::exception& failure) { // Of a builder.
                return std::to_string(count) + ": " + failure.what();
            }
    }

  private:
    /// Text carries no array of characters.
    static constexpr unsigned int usable = std::is_same_v<Stream, QrTextStream> ? 10 : 18;
};
TYPED_TEST_SUITE(Place, StreamKinds);

TYPED_TEST(Place, IsTheOneThatTheMediumTells) {
    std::mt19937 engine(20'261);
    int told = 0;
    for (int round = 0; round < 300 && !testing::Test::HasFailure(); ++round) {
        const std::string whole = this->randomObjects(engine);
        for (int damage = 0; damage < 10; ++damage) {
            std::string bytes = whole;
            const std::size_t at = engine() % bytes.size();
            if (damage % 5 == 0)
                bytes.resize(at);
            else if (std::is_same_v<TypeParam, QrBinaryStream>)
                bytes[at] = static_cast<char>(engine());
            else
                bytes[at] = "0123456789 \n-x"[engine() % 14];
            const std::string counted = this->template outcome<QrObjectInBuffer>(bytes);
            EXPECT_EQ(counted, this->template outcome<Asking>(bytes)) << round << ' ' << at;
            told += counted.find(": byte ") != std::string::npos;
        }
    }
    EXPECT_GT(told, 1000);
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
