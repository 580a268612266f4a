// SPDX-License-Identifier: BSL-1.0
// Tests that graphs of objects are read back as they were written.
#include "tests/objects/support.h"

#include "tests/streams/support.h"

namespace {

using namespace Mz;
using namespace Mz::Test;

template <class Stream>
using Graph = ObjectsOn<Stream>;
TYPED_TEST_SUITE(Graph, StreamKinds);

TYPED_TEST(Graph, ComesBackAsItWas) {
    const QrPtr<Node> leaf = this->node(-3);
    const QrPtr<Node> root = this->node(1, {this->node(2), leaf, this->node(4, {leaf})});
    Loading<TypeParam> in(saved<TypeParam>(root.get()));
    const QrPtr<Node> read = in.node();
    in.finish();
    ASSERT_TRUE(read);
    this->expectEqual(*read, *root);
    ASSERT_EQ(read->links.size(), 3U);
    for (std::size_t index = 0; index < 3; ++index)
        this->expectEqual(*read->links[index], *root->links[index]);
    EXPECT_EQ(in.source.peek(), std::istringstream::traits_type::eof());
}

TYPED_TEST(Graph, SharesWhatWasShared) {
    const QrPtr<Node> shared = this->node(9);
    const QrPtr<Node> root =
        this->node(1, {shared, this->node(2, {shared, shared}), shared, this->node(9)});
    const std::string bytes = saved<TypeParam>(root.get());
    const int before = this->alive();
    Loading<TypeParam> in(bytes);
    const QrPtr<Node> read = in.node();
    in.finish();
    EXPECT_EQ(this->alive() - before, 4);
    ASSERT_EQ(read->links.size(), 4U);
    EXPECT_EQ(read->links[0], read->links[2]);
    EXPECT_EQ(read->links[0], read->links[1]->links[0]);
    EXPECT_EQ(read->links[0], read->links[1]->links[1]);
    // An equal object is still another object.
    EXPECT_FALSE(read->links[0] == read->links[3]);
    this->expectEqual(*read->links[0], *read->links[3]);
}

TYPED_TEST(Graph, StoresASharedObjectOnce) {
    const QrPtr<Node> shared = this->node(9);
    shared->name.assign(1000, L'x');
    const std::size_t one = saved<TypeParam>(this->node(1, {shared}).get()).size();
    std::vector<QrPtr<Node>> links(100, shared);
    EXPECT_LT(saved<TypeParam>(this->node(1, links).get()).size(), one + 100 * 4);
}

TYPED_TEST(Graph, MayHaveCircles) {
    const int before = this->alive();
    {
        const QrPtr<Node> root = this->node(1, {this->node(2)});
        root->links.push_back(root);
        root->links[0]->links = {root, root->links[0]};
        Loading<TypeParam> in(saved<TypeParam>(root.get()));
        unlink(root);
        const QrPtr<Node> read = in.node();
        in.finish();
        ASSERT_EQ(read->links.size(), 2U);
        EXPECT_EQ(read->links[1], read);
        ASSERT_EQ(read->links[0]->links.size(), 2U);
        EXPECT_EQ(read->links[0]->links[0], read);
        EXPECT_EQ(read->links[0]->links[1], read->links[0]);
        EXPECT_EQ(read->links[0]->number, 2);
        unlink(read);
    }
    EXPECT_EQ(this->alive(), before);
}

TYPED_TEST(Graph, MayHaveNothingInIt) {
    const QrPtr<Node> root = this->node(1, {nullptr, this->node(2), nullptr});
    Loading<TypeParam> in(saved<TypeParam>(root.get()));
    const QrPtr<Node> read = in.node();
    in.finish();
    ASSERT_EQ(read->links.size(), 3U);
    EXPECT_FALSE(read->links[0]);
    EXPECT_TRUE(read->links[1]);
    EXPECT_FALSE(read->links[2]);
}

TYPED_TEST(Graph, OfNothingIsNull) {
    Loading<TypeParam> in(saved<TypeParam>(nullptr));
    EXPECT_FALSE(in.object());
    EXPECT_EQ(in.source.peek(), std::istringstream::traits_type::eof());
    // A null object is returned for any interface.
    Loading<TypeParam> again(saved<TypeParam>(nullptr));
    EXPECT_FALSE(again.object(&Stranger::uid));
}

TYPED_TEST(Graph, IsToldInTheOrderOfCompletion) {
    const QrPtr<Node> shared = this->node(4);
    const QrPtr<Node> root =
        this->node(1, {this->node(2, {this->node(3), shared}), this->node(5, {shared})});
    Loading<TypeParam> in(saved<TypeParam>(root.get()));
    forgetNotes();
    const QrRef<QrCastable> read = in.object();
    EXPECT_STREQ(allNotes(), "");
    in.finish();
    EXPECT_STREQ(allNotes(), "3 4 2 5 1 ");
    in.finish();
    EXPECT_STREQ(allNotes(), "3 4 2 5 1 ");
}

TYPED_TEST(Graph, SharesObjectsAmongAllThatStandOnOneStream) {
    const QrPtr<Node> shared = this->node(7);
    const QrPtr<Node> first = this->node(1, {shared});
    const QrPtr<Node> second = this->node(2, {shared, first});
    Saving<TypeParam> out;
    out.stream << first.get() << second.get() << shared.get();
    out.stream << static_cast<const QrCastable*>(nullptr) << first.get();

    Loading<TypeParam> in(out.bytes());
    const QrPtr<Node> firstRead = in.node();
    const QrPtr<Node> secondRead = in.node();
    const QrPtr<Node> sharedRead = in.node();
    EXPECT_FALSE(in.object());
    const QrPtr<Node> firstAgain = in.node();
    in.finish();
    EXPECT_EQ(firstRead->links[0], sharedRead);
    EXPECT_EQ(secondRead->links[0], sharedRead);
    EXPECT_EQ(secondRead->links[1], firstRead);
    EXPECT_EQ(firstAgain, firstRead);
}

TYPED_TEST(Graph, StandsBetweenPlainValues) {
    Saving<TypeParam> out;
    const QrPtr<Node> first = this->node(1);
    const QrPtr<Node> second = this->node(2, {first});
    out.stream << 11 << first.get() << 2.5 << 13U << second.get() << static_cast<short>(-14);
    Loading<TypeParam> in(out.bytes());
    int number = 0;
    double real = 0;
    unsigned int unsignedNumber = 0;
    short small = 0;
    in.stream >> number;
    const QrPtr<Node> firstRead = in.node();
    in.stream >> real >> unsignedNumber;
    const QrPtr<Node> secondRead = in.node();
    in.stream >> small;
    in.finish();
    EXPECT_EQ(number, 11);
    EXPECT_EQ(real, 2.5);
    EXPECT_EQ(unsignedNumber, 13U);
    EXPECT_EQ(small, -14);
    EXPECT_EQ(secondRead->links[0], firstRead);
}

TYPED_TEST(Graph, HoldsObjectsOfSeveralLibraries) {
    const QrPtr<Node> other = this->make(viewedUid);
    other->number = 77;
    const QrPtr<Node> root = this->node(1, {other});
    Loading<TypeParam> in(saved<TypeParam>(root.get()));
    const QrPtr<Node> read = in.node();
    in.finish();
    EXPECT_EQ(read->links[0]->number, 77);
}

TYPED_TEST(Graph, GivesEveryObjectAsItsPrincipalInterface) {
    const QrPtr<Node> viewed = this->make(viewedUid);
    Loading<TypeParam> in(saved<TypeParam>(viewed.get()));
    const QrRef<QrCastable> read = in.object();
    EXPECT_EQ(read.get(), read->getCastable());
}

TYPED_TEST(Graph, KnowsAnObjectByWhicheverInterfaceItIsWritten) {
    const QrPtr<Node> root = this->node(1);
    Saving<TypeParam> out;
    const QrPtr<QrPersistant> persistant = queryCast<QrPersistant>(root.get());
    out.stream << persistant.get() << root.get();
    Loading<TypeParam> in(out.bytes());
    const QrPtr<Node> first = in.node();
    EXPECT_EQ(first, in.node());
}

TYPED_TEST(Graph, RemembersTheObjectAndNotTheCompanionThatReadsIt) {
    const QrPtr<Node> owner = this->make(companionUid);
    owner->number = 5;
    Saving<TypeParam> out;
    out.stream << owner.get() << owner.get();
    Loading<TypeParam> in(out.bytes());
    const QrPtr<Node> read = in.node();
    const QrPtr<Node> again = in.node();
    in.finish();
    EXPECT_EQ(read->number, 5);
    EXPECT_TRUE(read->flag) << "the object that the companion read must be its owner";
    EXPECT_EQ(read, again);
}

TYPED_TEST(Graph, KeepsAnObjectThatAsksToBeToldWhileItIsRead) {
    const QrPtr<Node> selfish = this->make(selfishUid);
    selfish->number = 8;
    const std::string bytes = saved<TypeParam>(selfish.get());
    forgetNotes();
    {
        Loading<TypeParam> in(bytes);
        const QrPtr<Node> read = in.node();
        EXPECT_STREQ(allNotes(), "made ");
        EXPECT_EQ(read->number, 8);
        in.finish();
        EXPECT_STREQ(allNotes(), "made told ");
    }
    EXPECT_STREQ(allNotes(), "made told deleted ");
}

TYPED_TEST(Graph, OutlivesTheReader) {
    const int before = this->alive();
    {
        QrPtr<Node> read;
        {
            Loading<TypeParam> in(saved<TypeParam>(this->node(1, {this->node(2)}).get()));
            read = in.node();
            in.finish();
        }
        EXPECT_EQ(this->alive(), before + 2);
        EXPECT_EQ(read->links[0]->number, 2);
    }
    EXPECT_EQ(this->alive(), before);
}

TYPED_TEST(Graph, KeepsWhatWasWrittenSoThatNoAddressIsUsedTwice) {
    Saving<TypeParam> out;
    for (int number = 0; number < 50; ++number)
        out.stream << this->node(number).get();
    Loading<TypeParam> in(out.bytes());
    for (int number = 0; number < 50; ++number)
        EXPECT_EQ(in.node()->number, number);
}

TYPED_TEST(Graph, ComesBackAfterABoolWhereverThatStands) {
    const QrPtr<Node> tail = this->node(3);
    for (const bool flag : {false, true})
        for (const double weight : {0.0, 10.0}) {
            const QrPtr<Node> root = this->node(1, {tail});
            root->flag = flag;
            root->weight = weight;
            Loading<TypeParam> in(saved<TypeParam>(root.get()));
            const QrPtr<Node> read = in.node();
            in.finish();
            this->expectEqual(*read, *root);
        }
}

TYPED_TEST(Graph, OfManyObjectsIsWrittenAgainAsTheSameBytes) {
    std::vector<QrPtr<Node>> nodes;
    for (int number = 0; number < 2000; ++number)
        nodes.push_back(this->node(number, number > 0 ? std::vector<QrPtr<Node>>{nodes.front()}
                                                      : std::vector<QrPtr<Node>>()));
    const QrPtr<Node> root = this->node(-1, nodes);
    const std::string bytes = saved<TypeParam>(root.get());
    Loading<TypeParam> in(bytes);
    const QrPtr<Node> read = in.node();
    in.finish();
    EXPECT_EQ(saved<TypeParam>(read.get()), bytes);
}

TYPED_TEST(Graph, WhoseInterfaceComesFromATranslationIsAccepted) {
    const QrPtr<Node> root = this->node(1);
    Saving<TypeParam> out;
    out.stream << root.get() << root.get();
    class Translator final : public QrCastImpl<Translator, Stranger> {
    } translator;
    Loading<TypeParam> in(out.bytes());
    const QrRef<QrCastable> read = in.object();
    QrAddTranslation(read.get(), &translator,
                     [](const QrUid& uid) { return uid == Stranger::uid; });
    EXPECT_EQ(in.object(&Stranger::uid), read);
    QrRemoveTranslation(read.get(), &translator);
}

TEST_F(Objects, HaveTheseBytesOnEveryPlatform) {
    Scripted inner(nodeUid, 2, [](QrStream& s) { s << true; });
    Scripted outer(stringUid, 7, [&](QrStream& s) {
        s << -2 << &inner << 1.0F << &inner << static_cast<const QrCastable*>(nullptr);
    });
    Saving<QrBinaryStream> binary;
    binary.stream << &outer << &inner << static_cast<const QrCastable*>(nullptr);
    EXPECT_EQ(toHex(binary.bytes()),
              "00 00 00 01 3A 5D 1C 12 7E 2B 4F 19 B1 C6 0A 2D 55 AA 12 01 00 00 00 07 "
              "FF FF FF FE "
              "00 00 00 02 3A 5D 1C 11 7E 2B 4F 19 B1 C6 0A 2D 55 AA 12 01 00 00 00 02 "
              "01 45 4F 42 48 "
              "3F 80 00 00 00 00 00 02 00 00 00 00 45 4F 42 4B "
              "00 00 00 02 45 4F 42 48 00 00 00 00 45 4F 42 4A");
    Saving<QrTextStream> text;
    text.stream << &outer << &inner << static_cast<const QrCastable*>(nullptr);
    EXPECT_EQ(text.bytes(), "1 979180562 2116767513 2982545965 1437209089 7 -2\n"
                            "2 979180561 2116767513 2982545965 1437209089 2 11162822216 1\n"
                            "2\n0 1162822219\n"
                            "2 1162822216\n0 1162822218");
}

TEST_F(Objects, OfAFileWithCarriageReturnsComeBack) {
    const QrPtr<Node> root = node(1, {node(2), node(3)});
    std::string text;
    for (const char c : saved<QrTextStream>(root.get()))
        text += c == '\n' ? std::string("\r\n") : std::string(1, c);
    Loading<QrTextStream> in(text);
    const QrPtr<Node> read = in.node();
    in.finish();
    expectEqual(*read, *root);
    EXPECT_EQ(read->links[1]->number, 3);
}

} // namespace
