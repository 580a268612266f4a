// SPDX-License-Identifier: BSL-1.0
// Tests faults in objects, classes and files, and the reason that the exception states.
#include "tests/objects/support.h"

namespace {

using namespace Mz;
using namespace Mz::Test;
using testing::EndsWith;
using testing::HasSubstr;
using testing::StartsWith;

constexpr const char* nodeText = "3A5D1C11-7E2B4F19-B1C60A2D-55AA1201";
constexpr const char* unknownText = "3A5D1CA9-7E2B4F19-B1C60A2D-55AA1201";

template <class Stream>
class Faulty : public ObjectsOn<Stream> {
  protected:
    /// Expects that an object of that class and version with this content cannot be read. Returns
    /// the reason.
    static std::string failureOf(
        const QrUid& uid, unsigned int version,
        std::function<void(QrStream&)> content = [](QrStream&) {}) {
        Scripted object(uid, version, std::move(content));
        Loading<Stream> in(saved<Stream>(&object));
        const std::string reason = readFailure([&] { in.object(); });
        EXPECT_THAT(reason, StartsWith("byte "));
        EXPECT_THAT(reason, EndsWith(": Error loading object."));
        // Later reads fail too.
        EXPECT_THAT(readFailure([&] { in.object(); }), HasSubstr("an earlier object failed"));
        return reason;
    }

    /// Writes what a node with the number 1 writes.
    static void writeNode(QrStream& s) {
        s << 1;
        QrWriteExactText(s, L"n");
        s << true << 0.5 << 0U;
    }
};
TYPED_TEST_SUITE(Faulty, StreamKinds);

TYPED_TEST(Faulty, ClassOfNoBuilderIsNamed) {
    EXPECT_THAT(this->failureOf(unknownUid, 1),
                HasSubstr(std::string("byte 0: no builder makes persistent objects of the class ") +
                          unknownText));
}

TYPED_TEST(Faulty, BuilderOfObjectsThatAreNotPersistentIsNamed) {
    EXPECT_THAT(this->failureOf(notPersistentUid, 1), HasSubstr("no builder makes persistent"));
    EXPECT_THAT(this->failureOf(makesNullUid, 1), HasSubstr("no builder makes persistent"));
}

TYPED_TEST(Faulty, VersionIsNamed) {
    EXPECT_THAT(this->failureOf(nodeUid, 4, this->writeNode),
                HasSubstr(std::string("the class ") + nodeText +
                          " is stored in version 4 and known in version 3"));
    EXPECT_THAT(this->failureOf(nodeUid, 2, this->writeNode), HasSubstr("stored in version 2"));
}

TYPED_TEST(Faulty, BuilderOfAnotherClassIsNamed) {
    EXPECT_THAT(this->failureOf(otherClassUid, 3, this->writeNode),
                HasSubstr(std::string("makes objects of the class ") + nodeText));
}

TYPED_TEST(Faulty, BuildersOwnExceptionPassesThrough) {
    Scripted object(throwingUid, 1, [](QrStream&) {});
    Loading<TypeParam> in(saved<TypeParam>(&object));
    try {
        in.object();
        FAIL();
    } catch (const std::runtime_error& failure) {
        EXPECT_STREQ(failure.what(), "the builder's own");
    }
    EXPECT_THAT(readFailure([&] { in.object(); }), HasSubstr("an earlier object failed"));
}

TYPED_TEST(Faulty, ObjectThatReadsLessThanWasWrittenIsNoticed) {
    EXPECT_THAT(this->failureOf(nodeUid, 3,
                                [](QrStream& s) {
                                    Faulty<TypeParam>::writeNode(s);
                                    s << 5;
                                }),
                HasSubstr("the object should end here and does not"));
}

TYPED_TEST(Faulty, WrongEndIsToldByThePlaceOfItsMark) {
    Saving<TypeParam> record;
    record.stream << 1U << nodeUid << 3U;
    this->writeNode(record.stream);
    const std::string end = std::to_string(record.bytes().size());
    EXPECT_THAT(this->failureOf(nodeUid, 3,
                                [](QrStream& s) {
                                    Faulty<TypeParam>::writeNode(s);
                                    s << 5;
                                }),
                HasSubstr("byte " + end + ": the object should end here and does not"));
}

TYPED_TEST(Faulty, WrongEndOfAKnownObjectIsToldByThePlaceOfItsRecord) {
    const QrPtr<Node> root = this->node(1);
    Saving<TypeParam> out;
    out.stream << root.get();
    const std::string second = std::to_string(out.bytes().size());
    out.stream << 1U << 7U;
    Loading<TypeParam> in(out.bytes());
    in.object();
    EXPECT_THAT(readFailure([&] { in.object(); }),
                HasSubstr("byte " + second + ": the object should end here and does not"));
}

TYPED_TEST(Faulty, ObjectThatReadsMoreThanWasWrittenIsNoticed) {
    this->failureOf(nodeUid, 3, [](QrStream& s) { s << 1; });
    this->failureOf(nodeUid, 3, [](QrStream&) {});
    // Data follows that the object could read by mistake.
    Scripted object(viewedUid, 1, [](QrStream&) {});
    Saving<TypeParam> out;
    out.stream << &object << 1 << 2 << 3;
    Loading<TypeParam> in(out.bytes());
    EXPECT_THAT(readFailure([&] { in.object(); }), HasSubstr("should end here"));
}

TYPED_TEST(Faulty, ObjectWithoutTheInterfaceWantedIsNoticed) {
    const QrPtr<Node> root = this->node(1);
    Loading<TypeParam> in(saved<TypeParam>(root.get()));
    EXPECT_THAT(readFailure([&] { in.object(&Stranger::uid); }),
                HasSubstr("byte 0: the object has not the interface 3A5D1C02-7E2B4F19-"));
    EXPECT_THAT(readFailure([&] { in.object(); }), HasSubstr("an earlier object failed"));
}

TYPED_TEST(Faulty, NumberThatIsNoObjectsIsNoticed) {
    for (const std::uint32_t number : {2U, 3U, 1000000U, 0xFFFFFFFFU}) {
        Saving<TypeParam> out;
        out.stream << number << nodeUid << 3U;
        this->writeNode(out.stream);
        Loading<TypeParam> in(out.bytes());
        EXPECT_THAT(readFailure([&] { in.object(); }), HasSubstr("byte 0: no object begins here"));
    }
}

TYPED_TEST(Faulty, NothingAtAllIsNoticed) {
    Loading<TypeParam> in("");
    EXPECT_THAT(readFailure([&] { in.object(); }), HasSubstr("Error reading stream."));
}

TYPED_TEST(Faulty, ObjectInsideAnotherFailsBoth) {
    Scripted unknown(unknownUid, 1, [](QrStream&) {});
    Scripted outer(carelessUid, 1,
                   [&](QrStream& s) { s << static_cast<const QrCastable*>(&unknown); });
    Loading<TypeParam> in(saved<TypeParam>(&outer));
    forgetNotes();
    EXPECT_THAT(readFailure([&] { in.object(); }), HasSubstr("an object inside this one failed"));
    EXPECT_STREQ(allNotes(), "swallowed ");
}

TYPED_TEST(Faulty, FailureOfAnObjectsOwnMakingIsToldWithTheObjectsPlace) {
    Scripted unknown(unknownUid, 1, [](QrStream&) {});
    EXPECT_EQ(this->failureOf(misleadingUid, 1,
                              [&](QrStream& s) { s << static_cast<const QrCastable*>(&unknown); }),
              "byte 0: inside the object that begins here: Error loading object.: Error loading "
              "object.");
}

TYPED_TEST(Faulty, FailedCastInAnObjectsCodeIsToldWithTheObjectsPlace) {
    EXPECT_EQ(this->failureOf(miscastUid, 1),
              "byte 0: inside the object that begins here: Bad cast in QrCastable::safeCast: Error "
              "loading object.");
}

TYPED_TEST(Faulty, InnermostPlaceIsTold) {
    Scripted inner(unknownUid, 1, [](QrStream&) {});
    const std::size_t begin = saved<TypeParam>(nullptr).size();
    Saving<TypeParam> out;
    out.stream << static_cast<const QrCastable*>(nullptr) << &inner;
    Loading<TypeParam> in(out.bytes());
    EXPECT_FALSE(in.object());
    EXPECT_THAT(readFailure([&] { in.object(); }),
                StartsWith("byte " + std::to_string(begin) + ": no builder"));
}

TYPED_TEST(Faulty, PlaceIsToldEvenIfTheMediumCannotTell) {
    class NoPosition final : public QrForwardingIO {
      public:
        explicit NoPosition(QrCastable* io) : QrForwardingIO(io) {}
        const QrCastable* getCastable() const override { return this; }
        QrCastable* getCastable() override { return this; }
        QrCastable* getInterface(const QrUid& uid) override {
            return hasInterface(uid) ? this : nullptr;
        }
        bool hasInterface(const QrUid& uid) const override { return uid == QrBufferedIO::uid; }
        void destroy() override {}
        int64 tell() const override { return -1; }
    };
    std::istringstream source("");
    QrInBuffer buffer(&source);
    NoPosition blind(&buffer);
    QrObjectInBuffer objects(&blind);
    TypeParam stream(&objects);
    EXPECT_THAT(readFailure([&] { stream.readObject(nullptr, nullptr, nullptr); }),
                StartsWith("unknown position: inside the object that begins here: Error reading"));
    // A wrong end.
    Scripted object(nodeUid, 3, [](QrStream& s) {
        Faulty<TypeParam>::writeNode(s);
        s << 5;
    });
    std::istringstream longer(saved<TypeParam>(&object));
    QrInBuffer longerBuffer(&longer);
    NoPosition blindBuffer(&longerBuffer);
    QrObjectInBuffer longerObjects(&blindBuffer);
    TypeParam longerStream(&longerObjects);
    EXPECT_THAT(readFailure([&] { longerStream.readObject(nullptr, nullptr, nullptr); }),
                StartsWith("unknown position: the object should end here"));
}

TYPED_TEST(Faulty, ObjectThatIsNotPersistentIsRefusedAndNothingOfItWritten) {
    const QrPtr<Node> plain = this->make(notPersistentUid);
    Saving<TypeParam> out;
    out.stream << this->node(1).get();
    const std::string before = out.bytes();
    try {
        out.stream << plain.get();
        FAIL();
    } catch (const QrStreamEx::ExWriteObject& failure) {
        EXPECT_EQ(std::string(failure.getReason()),
                  "byte " + std::to_string(out.bytes().size()) +
                      ": the object is not persistent: Error storing object.");
    }
    out.stream << this->node(2).get();
    Loading<TypeParam> in(out.bytes());
    EXPECT_EQ(in.node()->number, 1);
    EXPECT_EQ(in.node()->number, 2);
    EXPECT_TRUE(out.bytes().starts_with(before));
}

TYPED_TEST(Faulty, ObjectThatFailsWhileItIsWrittenEndsTheWriting) {
    Scripted failing(nodeUid, 3, [](QrStream& s) {
        s << 1;
        throw std::runtime_error("the object's own");
    });
    Saving<TypeParam> out;
    EXPECT_THROW(out.stream << &failing, std::runtime_error);
    EXPECT_THROW(out.stream << this->node(1).get(), QrStreamEx::ExWriteObject);
    EXPECT_THROW(out.stream << static_cast<const QrCastable*>(nullptr), QrStreamEx::ExWriteObject);
    Loading<TypeParam> in(out.bytes());
    readFailure([&] { in.object(); });
}

TYPED_TEST(Faulty, ObjectInsideAnotherThatFailsToBeWrittenFailsBoth) {
    Scripted failing(nodeUid, 3, [](QrStream& s) {
        s << 1;
        throw std::runtime_error("the object's own");
    });
    Scripted outer(carelessUid, 1, [&](QrStream& s) {
        EXPECT_THROW(s << static_cast<const QrCastable*>(&failing), std::runtime_error);
    });
    Saving<TypeParam> out;
    EXPECT_THROW(out.stream << &outer, QrStreamEx::ExWriteObject);
}

TYPED_TEST(Faulty, ObjectRefusedInsideAnotherMayBeLeftOut) {
    const QrPtr<Node> careless = this->make(carelessUid);
    careless->links = {this->make(notPersistentUid), this->node(1)};
    Loading<TypeParam> in(saved<TypeParam>(careless.get()));
    EXPECT_TRUE(in.node());
}

/// Returns a chain of `depth` nodes, each of which contains the next one.
QrPtr<Node> chain(const std::function<QrPtr<Node>()>& make, int depth) {
    QrPtr<Node> first = make();
    QrPtr<Node> last = first;
    for (int level = 1; level < depth; ++level) {
        last->links = {make()};
        last = last->links[0];
    }
    return first;
}

TYPED_TEST(Faulty, NestingIsAllowedToTheStatedDepthOnly) {
    static_assert(QrMaximumObjectDepth == 500);
    const auto make = [this] { return this->node(1); };
    const QrPtr<Node> deepest = chain(make, 500);
    Loading<TypeParam> in(saved<TypeParam>(deepest.get()));
    QrPtr<Node> read = in.node();
    in.finish();
    int depth = 0;
    for (; read; ++depth)
        read = read->links.empty() ? nullptr : read->links[0];
    EXPECT_EQ(depth, 500);

    Saving<TypeParam> out;
    try {
        out.stream << chain(make, 501).get();
        FAIL();
    } catch (const QrStreamEx::ExWriteObject& failure) {
        EXPECT_THAT(failure.getReason(), HasSubstr(": objects are nested too deeply"));
    }
}

TYPED_TEST(Faulty, NestingBeyondTheStatedDepthIsNoticedWhenItIsRead) {
    for (const unsigned int depth : {500U, 501U, 100000U}) {
        Loading<TypeParam> in(writtenChain<TypeParam>(depth));
        if (depth <= 500) {
            EXPECT_TRUE(in.node());
            in.finish();
        } else {
            EXPECT_THAT(readFailure([&] { in.object(); }),
                        HasSubstr(": objects are nested too deeply"));
        }
    }
}

TYPED_TEST(Faulty, KnownAndNullObjectsMayStandAtTheLastLevel) {
    const auto make = [this] { return this->node(1); };
    const QrPtr<Node> root = chain(make, 500);
    QrPtr<Node> last = root;
    while (!last->links.empty())
        last = last->links[0];
    last->links = {root, nullptr, last};
    Loading<TypeParam> in(saved<TypeParam>(root.get()));
    unlink(root);
    const QrPtr<Node> read = in.node();
    in.finish();
    ASSERT_TRUE(read);
    unlink(read);
}

TEST_F(Objects, AreRefusedByTheBuffersThemselves) {
    std::istringstream source("0");
    QrInBuffer buffer(&source);
    QrTextStream stream(&buffer);
    EXPECT_THROW(stream.readObject(nullptr, nullptr, nullptr), QrStreamEx::ExReadObjectImp);
    std::ostringstream sink;
    QrOutBuffer out(&sink);
    QrTextStream outStream(&out);
    EXPECT_THROW(outStream << node(1).get(), QrStreamEx::ExWriteObjectImp);
}

TEST_F(Objects, NeedAnIOUnderThem) {
    EXPECT_THROW(QrObjectInBuffer(nullptr), QrComponentManagerEx::ExBadCast);
    EXPECT_THROW(QrObjectOutBuffer(nullptr), QrComponentManagerEx::ExBadCast);
    const QrPtr<Node> noIO = node(1);
    EXPECT_THROW(QrObjectInBuffer(noIO.get()), QrComponentManagerEx::ExBadCast);
}

TEST_F(Objects, AreNotReadFromOutputNorWrittenToInput) {
    std::ostringstream sink;
    QrOutBuffer out(&sink);
    QrObjectInBuffer wrongIn(&out);
    QrBinaryStream reading(&wrongIn);
    EXPECT_THAT(readFailure([&] { reading.readObject(nullptr, nullptr, nullptr); }),
                HasSubstr("Read on output stream."));
    std::istringstream source;
    QrInBuffer in(&source);
    QrObjectOutBuffer wrongOut(&in);
    QrBinaryStream writing(&wrongOut);
    EXPECT_THROW(writing << node(1).get(), QrStreamEx::ExWrite);
    // An object input rejects writing in the same way as its buffer does, and an object output
    // reading.
    QrObjectInBuffer rightIn(&in);
    QrBinaryStream other(&rightIn);
    EXPECT_THROW(other << node(1).get(), QrStreamEx::ExWriteObjectImp);
}

} // namespace
