// SPDX-License-Identifier: BSL-1.0
// Tests the recorded list: its golden bytes, cut and damaged lists, and the companion that reads
// and writes it.
#include "tests/streams/support.h"

#include "components/componentManager/manager/componentImpPrivate.h"

#include <gtest/gtest.h>

namespace {

using namespace Mz::Test;
using Mz::ComponentLibrary;
using Mz::ComponentManager;
using Mz::QrBinaryStream;
using Mz::QrCastable;
using Mz::QrPersistant;
using Mz::QrPtr;
using Mz::QrStream;
using Mz::QrStreamEx;
using Mz::QrTextStream;

QrPtr<QrPersistant> companionOf(QrCastable& manager) {
    return QrPtr<QrPersistant>::adopt(Mz::safeCast<QrPersistant>(&manager));
}

template <class Stream = QrBinaryStream>
std::string listOf(ComponentManager& manager) {
    return written<Stream>([&](QrStream& stream) { companionOf(manager)->write(stream); });
}

void addBuilder(ComponentLibrary& library, unsigned int name, const std::wstring& text, bool flag) {
    ComponentManager::Builder& builder = library.builders.emplace_back();
    builder.library = &library;
    builder.uid = {name, 2, 3, 0xFFFFFFFF};
    builder.name = L"n" + text;
    builder.label = text;
    builder.text = L"";
    builder.flag = flag;
    builder.number = name * 0x01000000;
}

/// A manager with the records of three libraries, without files.
struct Known {
    Known() {
        ComponentLibrary& first = manager.libraries.emplace_back(manager);
        first.directory = L"c:\\parts";
        first.fileName = L"a.dll";
        first.fileTime = 0x80000001;
        first.fileSize = 0x100000002LL;
        first.descriptionValue = 7;
        first.componentText1 = L"label";
        first.componentText2 = L"text";
        addBuilder(first, 1, L"\xE9 x", true);
        addBuilder(first, 2, L"", false);
        ComponentLibrary& second = manager.libraries.emplace_back(manager);
        second.directory = L"c:\\parts";
        second.fileName = L"readme";
        second.fileTime = 5;
        second.fileSize = 6;
        ComponentLibrary& third = manager.libraries.emplace_back(manager);
        third.directory = L".";
        third.fileName = L"c";
        third.fileTime = 9;
        third.fileSize = -1;
        addBuilder(third, 3, L"z", true);
        manager.initialised = true;
    }
    ComponentManager manager;
};

void expectSame(const ComponentLibrary& read, const ComponentLibrary& kept) {
    EXPECT_EQ(read.directory, kept.directory);
    EXPECT_EQ(read.fileName, kept.fileName);
    EXPECT_EQ(read.fileTime, kept.fileTime);
    EXPECT_EQ(read.fileSize, kept.fileSize);
    // The list does not store these.
    EXPECT_EQ(read.descriptionValue, 0);
    EXPECT_EQ(read.componentText1, L"");
    EXPECT_EQ(read.componentText2, L"");
    EXPECT_EQ(read.module, nullptr);
    EXPECT_FALSE(read.loadedByManager);
    ASSERT_EQ(read.builders.size(), kept.builders.size());
    for (std::size_t index = 0; index < read.builders.size(); ++index) {
        const ComponentManager::Builder& builder = read.builders[index];
        EXPECT_EQ(builder.library, &read);
        EXPECT_EQ(builder.uid, kept.builders[index].uid);
        EXPECT_EQ(builder.name, kept.builders[index].name);
        EXPECT_EQ(builder.label, kept.builders[index].label);
        EXPECT_EQ(builder.text, kept.builders[index].text);
        EXPECT_EQ(builder.number, kept.builders[index].number);
        EXPECT_EQ(builder.flag, kept.builders[index].flag);
    }
}

TEST(RecordedList, AnUninitialisedManagerWritesNothing) {
    ComponentManager manager;
    EXPECT_EQ(listOf(manager), "");
    EXPECT_EQ(listOf<QrTextStream>(manager), "");
    manager.libraries.emplace_back(manager);
    EXPECT_EQ(listOf(manager), "");
}

template <class Stream>
void expectNoCount(const std::string& bytes) {
    ComponentManager manager;
    Reading<Stream> in(bytes);
    try {
        companionOf(manager)->read(in.stream);
        FAIL();
    } catch (const QrStreamEx::ExReadObject& error) {
        EXPECT_STREQ(error.getReason(), "Error loading object.");
        EXPECT_STREQ(error.getDetailedReason(),
                     "components/componentManager/componentImp(1260): Error loading object.");
    }
    EXPECT_TRUE(manager.libraries.empty());
}

TEST(RecordedList, WithoutACountReadingRaisesReadObjectAtItsFixedPlace) {
    expectNoCount<QrBinaryStream>("");
    expectNoCount<QrBinaryStream>(fromHex("00 00 00"));
    expectNoCount<QrTextStream>("");
    expectNoCount<QrTextStream>("x");
}

TEST(RecordedList, ComesBackAsItWas) {
    Known known;
    ComponentManager manager;
    Reading<QrBinaryStream> in(listOf(known.manager));
    companionOf(manager)->read(in.stream);
    EXPECT_EQ(in.rest(), "");
    EXPECT_FALSE(manager.initialised);
    EXPECT_EQ(manager.builderIndex.find({1, 2, 3, 0xFFFFFFFF}), nullptr);
    ASSERT_EQ(manager.libraries.size(), 3U);
    auto kept = known.manager.libraries.begin();
    for (const ComponentLibrary& read : manager.libraries)
        expectSame(read, *kept++);
    manager.initialised = true;
    EXPECT_EQ(listOf(manager), listOf(known.manager));
}

TEST(RecordedList, EqualTextsOfConsecutiveRecordsAreKeptOnce) {
    Known known;
    addBuilder(known.manager.libraries.front(), 4, L"", true);
    ComponentManager manager;
    Reading<QrBinaryStream> in(listOf(known.manager));
    companionOf(manager)->read(in.stream);
    auto library = manager.libraries.begin();
    const ComponentLibrary& first = *library++;
    const ComponentLibrary& second = *library++;
    const ComponentLibrary& third = *library;
    EXPECT_EQ(first.directory.c_str(), second.directory.c_str());
    EXPECT_STREQ(second.directory.c_str(), L"c:\\parts");
    EXPECT_STREQ(third.directory.c_str(), L".");
    ASSERT_EQ(first.builders.size(), 3U);
    EXPECT_EQ(first.builders[1].getName(), first.builders[2].getName());
    EXPECT_STREQ(first.builders[1].getName(), L"n");
    EXPECT_STREQ(first.builders[0].getName(), L"n\xE9 x");
}

TEST(RecordedList, LooksAsItAlwaysDid) {
    Known known;
    known.manager.libraries.pop_back();
    known.manager.libraries.pop_back();
    EXPECT_EQ(toHex(listOf(known.manager)),
              "00 00 00 01 "                                                 // libraries
              "00 00 00 08 63 3A 5C 70 61 72 74 73 "                         // directory
              "00 00 00 05 61 2E 64 6C 6C "                                  // fileName
              "80 00 00 01 00 00 00 01 00 00 00 02 "                         // time, size
              "00 00 00 02 "                                                 // builders, last first
              "00 00 00 02 00 00 00 02 00 00 00 03 FF FF FF FF "             // uid
              "00 00 00 01 6E 00 00 00 00 00 00 00 00 00 02 00 00 00 "       // texts, flag, number
              "00 00 00 01 00 00 00 02 00 00 00 03 FF FF FF FF "             // uid
              "00 00 00 04 6E E9 20 78 00 00 00 03 E9 20 78 00 00 00 00 01 " // texts, flag
              "01 00 00 00");                                                // number
}

TEST(RecordedList, AnInitialisedManagerReadsNothing) {
    Known known;
    const std::string before = listOf(known.manager);
    Reading<QrBinaryStream> in(before);
    companionOf(known.manager)->read(in.stream);
    EXPECT_EQ(in.rest(), before);
    EXPECT_EQ(listOf(known.manager), before);
    EXPECT_EQ(known.manager.libraries.size(), 3U);
}

TEST(RecordedList, ASecondListIsAppendedToTheFirst) {
    Known known;
    ComponentManager manager;
    for (int round = 0; round < 2; ++round) {
        Reading<QrBinaryStream> in(listOf(known.manager));
        companionOf(manager)->read(in.stream);
    }
    EXPECT_EQ(manager.libraries.size(), 6U);
}

TEST(RecordedList, AnEmptyListIsAList) {
    ComponentManager manager;
    manager.initialised = true;
    EXPECT_EQ(toHex(listOf(manager)), "00 00 00 00");
    ComponentManager other;
    Reading<QrBinaryStream> in(fromHex("00 00 00 00"));
    companionOf(other)->read(in.stream);
    EXPECT_TRUE(other.libraries.empty());
}

TEST(RecordedList, CannotBeReadFromText) {
    Known known;
    const std::string text = listOf<QrTextStream>(known.manager);
    EXPECT_EQ(text.find("3 8 c:\\parts5 a.dll2147483649 4294967298 2 2 2 3 4294967295 1 n0 0 0"),
              0U)
        << text;
    ComponentManager manager;
    Reading<QrTextStream> in(text);
    EXPECT_THROW(companionOf(manager)->read(in.stream), QrStreamEx::ExReadError);
}

/// Returns the size of a list of the first `count` libraries.
std::size_t bytesOf(std::size_t count) {
    Known known;
    while (known.manager.libraries.size() > count)
        known.manager.libraries.pop_back();
    return listOf(known.manager).size();
}

TEST(RecordedList, CutAnywhereKeepsWholeLibrariesAndNothingOfTheHalfRead) {
    Known known;
    const std::string whole = listOf(known.manager);
    for (std::size_t length = 4; length < whole.size(); ++length) {
        SCOPED_TRACE(length);
        ComponentManager manager;
        Reading<QrBinaryStream> in(whole.substr(0, length));
        EXPECT_THROW(companionOf(manager)->read(in.stream), QrStreamEx::ExReadError);
        std::size_t complete = 0;
        while (bytesOf(complete + 1) <= length)
            ++complete;
        ASSERT_EQ(manager.libraries.size(), complete + 1);
        auto kept = known.manager.libraries.begin();
        auto read = manager.libraries.begin();
        for (std::size_t index = 0; index < complete; ++index)
            expectSame(*read++, *kept++);
        EXPECT_EQ(read->fileTime, 0U);
        EXPECT_EQ(read->fileSize, 0);
        EXPECT_TRUE(read->builders.empty());
    }
    for (std::size_t length = 0; length < 4; ++length)
        expectNoCount<QrBinaryStream>(whole.substr(0, length));
}

/// Reads a list that must fail. `manager` then has what was accepted.
struct Hostile {
    explicit Hostile(const std::string& bytes) : in(bytes) {
        EXPECT_THROW(companionOf(manager)->read(in.stream), QrStreamEx::ExReadError);
    }
    std::size_t characters() const {
        std::size_t sum = 0;
        for (const ComponentLibrary& library : manager.libraries)
            sum += library.directory.view().size() + library.fileName.view().size();
        return sum;
    }
    ComponentManager manager;
    Reading<QrBinaryStream> in;
};

TEST(RecordedList, FalseCountsCostNoMoreThanTheInputHas) {
    EXPECT_EQ(Hostile(fromHex("FF FF FF FF")).manager.libraries.size(), 0U);
    EXPECT_EQ(Hostile(fromHex("80 00 00 00")).manager.libraries.size(), 0U);
    EXPECT_EQ(Hostile(fromHex("7F FF FF FF")).manager.libraries.size(), 1U);
    // A builder count of four billion.
    const Hostile builders(fromHex("00 00 00 01 00 00 00 00 00 00 00 00 00 00 00 01 00 00 00 00 "
                                   "00 00 00 01 FF FF FF FF 00 00 00 01"));
    ASSERT_EQ(builders.manager.libraries.size(), 1U);
    EXPECT_TRUE(builders.manager.libraries.front().builders.empty());
    EXPECT_EQ(builders.manager.libraries.front().fileTime, 0U);
}

TEST(RecordedList, FalseLengthsCostNoMoreThanTheInputHas) {
    for (const char* length : {"7F FF FF FF", "FF FF FF FF", "80 00 00 00", "00 10 00 00"}) {
        SCOPED_TRACE(length);
        const Hostile directory(fromHex("00 00 00 01 " + std::string(length) + " 61 62"));
        EXPECT_LE(directory.characters(), 300'000U);
    }
}

TEST(RecordedList, ANulIsInNoTextOfAList) {
    // A text never consumes a NUL byte. Each text of the list would be filled with as many NULs as
    // it claims.
    const Hostile nul(fromHex("00 00 00 01 00 00 00 02 61 00 62"));
    ASSERT_EQ(nul.manager.libraries.size(), 1U);
    std::string flood = fromHex("00 00 03 E8");
    for (int count = 0; count < 1000; ++count)
        flood += fromHex("00 0F FF FF 00 0F FF FF 00 00 00 01 00 00 00 00 00 00 00 01 00 00 00 00");
    EXPECT_LE(Hostile(flood).characters(), 4'000'000U);
}

TEST(RecordedList, EveryCastGivesACompanionOfItsOwn) {
    ComponentManager local;
    for (QrCastable* manager :
         {static_cast<QrCastable*>(&local), static_cast<QrCastable*>(QrGetComponentManager())}) {
        EXPECT_TRUE(manager->hasInterface(QrPersistant::uid));
        const QrPtr<QrPersistant> first = companionOf(*manager);
        const QrPtr<QrPersistant> second = companionOf(*manager);
        EXPECT_NE(first.get(), second.get());
        EXPECT_EQ(first->getCastable(), manager->getCastable());
        EXPECT_EQ(second->getCastable(), manager->getCastable());
        EXPECT_EQ(first->newReference(), 1);
        EXPECT_EQ(first->release(), 0);
        ASSERT_NE(first->getClassUid(), nullptr);
        EXPECT_EQ(*first->getClassUid(),
                  (Mz::QrUid{0x0C3F6A00, 0xADC511D1, 0x988AFC24, 0x07C10E27}));
        EXPECT_EQ(first->getVersion(), 1U);
        // It answers casts to its own interface, and passes all others to the manager.
        const QrPtr<QrCastable> self =
            QrPtr<QrCastable>::adopt(first->getInterface(QrPersistant::uid));
        EXPECT_EQ(self.get(), first.get());
        const auto back = Mz::queryCast<Mz::QrComponentManager>(first.get());
        EXPECT_EQ(back.get(), manager);
        EXPECT_TRUE(first->hasInterface(Mz::QrComponentManager::uid));
        EXPECT_FALSE(first->hasInterface(Mz::QrBufferedIO::uid));
        first->loadFinished();
    }
}

} // namespace
