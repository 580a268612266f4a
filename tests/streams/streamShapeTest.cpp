// SPDX-License-Identifier: BSL-1.0
// Tests what compiled code needs of the stream classes: vtable slots, overloads, and how a stream
// finds its IO.
#include "tests/abi/slots.h"
#include "tests/streams/recordingIO.h"
#include "tests/streams/support.h"

#include "components/componentManager/translation.h"

#include <gtest/gtest.h>

#include <concepts>
#include <cstddef>
#include <memory>

namespace {

using namespace Mz::Test;
using Mz::int64;
using Mz::QrBinaryStream;
using Mz::QrCastable;
using Mz::QrPersistant;
using Mz::QrStream;
using Mz::QrTextStream;
using UInt64 = unsigned long long;

/// Returns the vtable slot of a virtual function.
template <class Member>
int slot(Member member) {
    const std::ptrdiff_t found = Mz::Test::slotOf(member);
    EXPECT_GE(found, 0) << "not virtual";
    return static_cast<int>(found);
}

template <class T>
int writeSlot() {
    return slot(static_cast<void (QrStream::*)(const T&, int)>(&QrStream::write));
}
template <class T>
int readSlot() {
    return slot(static_cast<int (QrStream::*)(T&, int)>(&QrStream::read));
}
template <class T>
int insertSlot() {
    return slot(static_cast<QrStream& (QrStream::*)(T)>(&QrStream::operator<<));
}
template <class T>
int extractSlot() {
    return slot(static_cast<QrStream& (QrStream::*)(T&)>(&QrStream::operator>>));
}

/// Expects the slots of the types to be consecutive from `first`, in the order of the types in a
/// group.
void expectGroup(int first, int (*const (&slots)[15])()) {
    for (int index = 0; index < 15; ++index)
        EXPECT_EQ(slots[index](), first + index) << "type " << index;
}

TEST(StreamShape, OperationsStandInTheOrderThatLibrariesWereBuiltWith) {
    // The destructors have the first two slots.
    EXPECT_EQ(slot(&QrStream::isTextStream), 2);
    EXPECT_EQ(slot(&QrStream::isBinaryStream), 3);
    EXPECT_EQ(slot(&QrStream::postLoad), 4);
    EXPECT_EQ(slot(&QrStream::transfer), 5);
    EXPECT_EQ(slot(&QrStream::computeLineNb), 6);
    expectGroup(7,
                {writeSlot<UInt64>, writeSlot<int64>, writeSlot<std::wstring>, writeSlot<double>,
                 writeSlot<float>, writeSlot<bool>, writeSlot<unsigned long>, writeSlot<long>,
                 writeSlot<unsigned int>, writeSlot<int>, writeSlot<unsigned short>,
                 writeSlot<short>, writeSlot<unsigned char>, writeSlot<wchar_t>, writeSlot<char>});
    expectGroup(22, {insertSlot<UInt64>, insertSlot<int64>, insertSlot<const std::wstring&>,
                     insertSlot<double>, insertSlot<float>, insertSlot<bool>,
                     insertSlot<unsigned long>, insertSlot<long>, insertSlot<unsigned int>,
                     insertSlot<int>, insertSlot<unsigned short>, insertSlot<short>,
                     insertSlot<unsigned char>, insertSlot<wchar_t>, insertSlot<char>});
    expectGroup(37, {readSlot<UInt64>, readSlot<int64>, readSlot<std::wstring>, readSlot<double>,
                     readSlot<float>, readSlot<bool>, readSlot<unsigned long>, readSlot<long>,
                     readSlot<unsigned int>, readSlot<int>, readSlot<unsigned short>,
                     readSlot<short>, readSlot<unsigned char>, readSlot<wchar_t>, readSlot<char>});
    expectGroup(52, {extractSlot<UInt64>, extractSlot<int64>, extractSlot<std::wstring>,
                     extractSlot<double>, extractSlot<float>, extractSlot<bool>,
                     extractSlot<unsigned long>, extractSlot<long>, extractSlot<unsigned int>,
                     extractSlot<int>, extractSlot<unsigned short>, extractSlot<short>,
                     extractSlot<unsigned char>, extractSlot<wchar_t>, extractSlot<char>});
    EXPECT_EQ(slot(&QrStream::formattedWrite), 67);
    EXPECT_EQ(slot(&QrStream::formattedRead), 68);
}

TEST(StreamShape, PersistentObjectsExtendTheRootInOrder) {
    EXPECT_EQ(
        slot(static_cast<const QrCastable* (QrPersistant::*)() const>(&QrPersistant::getCastable)),
        0);
    EXPECT_EQ(slot(static_cast<QrCastable* (QrPersistant::*)()>(&QrPersistant::getCastable)), 1);
    EXPECT_EQ(slot(&QrPersistant::release), 6);
    EXPECT_EQ(slot(&QrPersistant::getClassUid), 9);
    EXPECT_EQ(slot(&QrPersistant::getVersion), 10);
    EXPECT_EQ(slot(&QrPersistant::write), 11);
    EXPECT_EQ(slot(&QrPersistant::read), 12);
    EXPECT_EQ(slot(&QrPersistant::loadFinished), 13);
    EXPECT_EQ(QrPersistant::uid, (Mz::QrUid{0x81C8DF24, 0xA78111D1, 0x988A4445, 0x53540000}));
}

template <class Stream, class T>
concept CanWrite = requires(Stream& stream, T value) {
    stream << value;
};

struct Unrelated {};

template <class Stream>
constexpr bool refusesOtherPointers =
    !CanWrite<Stream, const wchar_t*> && !CanWrite<Stream, const char*> &&
    !CanWrite<Stream, int*> && !CanWrite<Stream, void*> && !CanWrite<Stream, Unrelated*> &&
    !CanWrite<Stream, std::wstring*> && !CanWrite<Stream, void (*)()> &&
    !CanWrite<Stream, int Unrelated::*> && !CanWrite<Stream, int (Unrelated::*)()>;

static_assert(refusesOtherPointers<QrStream>);
static_assert(refusesOtherPointers<QrBinaryStream>);
static_assert(refusesOtherPointers<QrTextStream>);

template <class Stream>
constexpr bool takesObjects = CanWrite<Stream, const QrCastable*>&& CanWrite<Stream, QrCastable*>&&
    CanWrite<Stream, QrPersistant*>&& CanWrite<Stream, const RecordingIO*>;

static_assert(takesObjects<QrStream>);
static_assert(takesObjects<QrBinaryStream>);
static_assert(takesObjects<QrTextStream>);
static_assert(!std::copy_constructible<QrTextStream> && !std::is_default_constructible_v<QrStream>);

template <class Stream>
void expectWritesObject() {
    RecordingIO io;
    Stream stream(&io);
    RecordingIO object;
    stream << &object;
    stream << static_cast<QrCastable*>(&object);
    ASSERT_EQ(io.calls.size(), 2U);
    EXPECT_EQ(io.calls[0], "writeObject object null null");
    EXPECT_EQ(io.calls[1], "writeObject object null null");
}

TEST(StreamShape, PointersToObjectsAreObjectsToDerivedStreamsToo) {
    expectWritesObject<QrBinaryStream>();
    expectWritesObject<QrTextStream>();
}

TEST(StreamShape, DerivedStreamsOfferTheOverloadsThatTheyDoNotReplace) {
    Writing<QrBinaryStream> binary;
    binary.stream << wchar_t(65);
    EXPECT_EQ(binary.bytes(), "65");
    Reading<QrTextStream> text(fromHex("00 41"));
    wchar_t character = 0;
    EXPECT_EQ(text.stream.read(character, 1), 1);
    EXPECT_EQ(character, L'A');
}

TEST(StreamShape, ANullOrUnsuitableObjectIsABadCast) {
    using Mz::QrComponentManagerEx;
    EXPECT_THROW(QrTextStream(nullptr), QrComponentManagerEx::ExBadCast);
    EXPECT_THROW(QrBinaryStream(nullptr), QrComponentManagerEx::ExBadCast);

    struct Other final : Mz::QrCastImpl<Other, QrPersistant, const Other&> {
        const Mz::QrUid* getClassUid() const override { return &QrPersistant::uid; }
        unsigned int getVersion() const override { return 0; }
        void write(QrStream&) override {}
        void read(QrStream&) override {}
    } other;
    try {
        QrTextStream stream(&other);
        FAIL();
    } catch (const QrComponentManagerEx::ExBadCast& error) {
        EXPECT_STREQ(error.getReason(), "Bad cast in QrCastable::safeCast");
        EXPECT_STREQ(error.getDetailedReason(),
                     "components/componentManager/cast(71): Bad cast in QrCastable::safeCast");
    }
}

/// A counted object that supplies an IO.
struct CountedIO final : Mz::QrCastImpl<CountedIO, QrPersistant, const CountedIO&> {
    const Mz::QrUid* getClassUid() const override { return &QrPersistant::uid; }
    unsigned int getVersion() const override { return 0; }
    void write(QrStream&) override {}
    void read(QrStream&) override {}
    QrCastable* getInterface(const Mz::QrUid& uid) override {
        if (!(uid == Mz::QrBufferedIO::uid))
            return nullptr;
        ++references;
        return &io;
    }
    RecordingIO io;
    int references = 0;
};

TEST(StreamShape, TheIOIsWhatTheObjectAnswersForTheInterface) {
    CountedIO object;
    QrTextStream stream(&object);
    EXPECT_EQ(object.references, 1);
    stream << 5;
    EXPECT_EQ(object.io.written(), "5");
    EXPECT_EQ(object.references, 1);
}

TEST(StreamShape, AnObjectWithoutAnIOIsAskedThroughItsTranslators) {
    struct Mute final : Mz::QrCastImpl<Mute, QrPersistant, const Mute&> {
        const Mz::QrUid* getClassUid() const override { return &QrPersistant::uid; }
        unsigned int getVersion() const override { return 0; }
        void write(QrStream&) override {}
        void read(QrStream&) override {}
    } object;
    RecordingIO io;
    QrAddTranslation(&object, &io,
                     [](const Mz::QrUid& uid) { return uid == Mz::QrBufferedIO::uid; });
    {
        QrBinaryStream stream(&object);
        stream << 1;
    }
    QrRemoveTranslation(&object, &io);
    EXPECT_EQ(toHex(io.written()), "00 00 00 01");
    EXPECT_THROW(QrBinaryStream stream(&object), Mz::QrComponentManagerEx::ExBadCast);
}

} // namespace
