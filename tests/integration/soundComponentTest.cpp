// SPDX-License-Identifier: BSL-1.0
/// Tests component libraries without faults: written by hand and with the kit, loaded by the
/// manager and by the host, from the first record to the unload.
#include "tests/integration/managerFixture.h"

using namespace Mz;
using namespace Mz::Test;
using ::testing::IsEmpty;

namespace {

class SoundComponent : public ManagerTest {};

TEST_F(SoundComponent, WrittenByHandHasEveryFieldRecordedAsItSaid) {
    const auto file = add(L"goodByHand");
    initialize();
    const ComponentLibrary* library = find(file);
    ASSERT_TRUE(library);
    EXPECT_EQ(library->descriptionValue, 0x123456789ABCDEF);
    EXPECT_EQ(library->componentText1, L"Plain label");
    EXPECT_EQ(library->componentText2, L"Plain text");
    EXPECT_TRUE(library->loadedByManager);
    EXPECT_EQ(library->fileSize, static_cast<int64>(std::filesystem::file_size(file)));
    EXPECT_EQ(library->fileTime, platform::queryFile(file)->time);

    ASSERT_EQ(library->builders.size(), 3u);
    const ComponentManager::Builder& first = library->builders[0];
    EXPECT_EQ(first.getUid(), goodUid);
    EXPECT_STREQ(first.getName(), L"Name"); // Keeps its letter case.
    EXPECT_STREQ(first.getLabel(), L"Label");
    EXPECT_STREQ(first.getText(), L"Text");
    EXPECT_EQ(first.getNumber(), 4000000000u);
    EXPECT_TRUE(first.getFlag());
    EXPECT_STREQ(first.getComponentLabel(), L"Plain label");
    EXPECT_STREQ(first.getComponentText(), L"Plain text");
    EXPECT_EQ(first.library, library);
    const ComponentManager::Builder& second = library->builders[1];
    EXPECT_EQ(second.getUid(), goodSecondUid);
    EXPECT_STREQ(second.getName(), L"name");
    EXPECT_STREQ(second.getLabel(), L"");
    EXPECT_STREQ(second.getText(), L"\u00E4\u4E2D");
    EXPECT_EQ(second.getNumber(), 0u);
    EXPECT_FALSE(second.getFlag());
    EXPECT_EQ(names(), (Names{L"Name", L"name", L"third"}));
}

TEST_F(SoundComponent, IsAskedForNothingButWhatARecordHolds) {
    add(L"goodByHand");
    initialize();
    EXPECT_EQ(noted("itemAskedForMore"), 0);
    EXPECT_EQ(noted("itemMade"), 3);
    EXPECT_EQ(noted("itemGone"), 3);
    EXPECT_EQ(noted("enumerate"), 1);
    EXPECT_EQ(noted("entry"), 1);
    EXPECT_EQ(noted("builderMade"), 0);
}

TEST_F(SoundComponent, MakesObjectsWhichItsBuilderCreates) {
    add(L"goodByHand");
    add(L"goodWithKit");
    initialize();
    EXPECT_EQ(maker(goodUid), "good");
    EXPECT_EQ(maker(kitUid), "kit");
    EXPECT_EQ(noted("objectMade"), 1);
    EXPECT_EQ(noted("objectGone"), 1);
    EXPECT_EQ(noted("builderMade"), 1);
    EXPECT_EQ(noted("builderGone"), 1);
}

TEST_F(SoundComponent, WrittenWithTheKitIsRecorded) {
    const auto file = add(L"goodWithKit");
    initialize();
    ASSERT_TRUE(find(file));
    EXPECT_EQ(find(file)->componentText1, L"Kit label");
    EXPECT_EQ(find(file)->componentText2, L"Kit text");
    EXPECT_EQ(names(), (Names{L"kit"}));
    ASSERT_TRUE(indexed(kitUid));
    EXPECT_EQ(indexed(kitUid)->getNumber(), 7u);
}

TEST_F(SoundComponent, StaysLoadedUntilTheManagerIsGoneAndIsUnmappedThen) {
    const auto file = add(L"goodByHand");
    const auto kit = add(L"goodWithKit");
    initialize();
    EXPECT_TRUE(isMapped(file));
    EXPECT_TRUE(isMapped(kit));
    EXPECT_EQ(maker(goodUid), "good");
    EXPECT_EQ(maker(kitUid), "kit");
    restart();
    EXPECT_FALSE(isMapped(file));
    EXPECT_FALSE(isMapped(kit));
    EXPECT_EQ(noted("goodLoaded"), 1);
    EXPECT_EQ(noted("goodUnloaded"), 1);
}

TEST_F(SoundComponent, WrittenWithTheKitAnswersItsOwnStaticDestructorsAndFreesItsBuilders) {
    const auto file = add(L"asksInDestructor");
    initialize();
    EXPECT_EQ(names(), (Names{L"asks", L"counted"}));
    EXPECT_EQ(maker(asksCountedUid), "asks");
    EXPECT_EQ(noted("builderGone"), 0);
    restart();
    EXPECT_FALSE(isMapped(file));
    EXPECT_EQ(noted("answeredInDestructor"), 1);
    EXPECT_EQ(noted("builderGone"), 1);
}

TEST_F(SoundComponent, WrittenWithTheKitLeavesNoMemoryBehindWhenItIsUnloaded) {
    add(L"goodWithKit");
    add(L"asksInDestructor");
    const auto cycle = [&] {
        initialize();
        EXPECT_EQ(maker(kitUid), "kit");
        EXPECT_EQ(maker(asksCountedUid), "asks");
        restart();
        forgetNotes();
    };
    for (int warmUp = 0; warmUp < 20; ++warmUp)
        cycle();
    constexpr std::size_t cycles = 1000;
    const std::size_t before = allocatedBytes();
    for (std::size_t count = 0; count < cycles; ++count)
        cycle();
    // Allow less than one byte per cycle: the memory of the loader and the heap varies a little.
    EXPECT_LT(allocatedBytes(), before + cycles);
}

TEST_F(SoundComponent, IsGivenBackEveryCountedDescription) {
    add(L"countedDescription");
    initialize();
    EXPECT_EQ(noted("descriptionMade"), 1);
    EXPECT_EQ(noted("descriptionGone"), 1);
    EXPECT_EQ(maker(countedUid), "counted");
    EXPECT_TRUE(manager->getBuilder(countedUid));
    EXPECT_EQ(noted("descriptionMade"), 3);
    EXPECT_EQ(noted("descriptionGone"), 3);
}

TEST_F(SoundComponent, MayAnswerThroughTranslatorsThroughout) {
    const auto file = add(L"translated");
    initialize();
    EXPECT_EQ(names(), (Names{L"translated"}));
    EXPECT_EQ(maker(translatedUid), "translated");
    EXPECT_EQ(noted("itemMade"), noted("itemGone"));
    EXPECT_EQ(noted("builderMade"), noted("builderGone"));
    restart();
    EXPECT_FALSE(isMapped(file));
}

TEST_F(SoundComponent, WithoutBuildersStaysLoaded) {
    const auto file = add(L"offersNothing");
    initialize();
    EXPECT_TRUE(isMapped(file));
    EXPECT_THAT(names(), IsEmpty());
    EXPECT_EQ(find(file)->componentText1, L"Plain label");
    EXPECT_EQ(find(file)->fileTime, platform::queryFile(file)->time);
}

TEST_F(SoundComponent, IsNotAskedTwiceByASecondInitialize) {
    add(L"goodByHand");
    initialize();
    TemporaryDirectory other;
    std::filesystem::copy_file(builtComponent(L"goodWithKit"),
                               other.path() / builtComponent(L"goodWithKit").filename());
    manager->initialize(searchPathOf(other.path()).c_str());
    EXPECT_EQ(names(), (Names{L"Name", L"name", L"third"}));
    EXPECT_EQ(noted("entry"), 1);
    EXPECT_EQ(manager->libraries.size(), 1u);
}

TEST_F(SoundComponent, IsNotFoundBeforeInitialize) {
    add(L"goodByHand");
    EXPECT_FALSE(manager->getBuilder(goodUid));
    EXPECT_FALSE(manager->createObject(goodUid));
    Collector collector;
    collector.atEnd = QrEnum::Fail;
    EXPECT_EQ(manager->enumerateBuilders(collector), QrEnum::Fail);
    EXPECT_EQ(collector.timesFinished, 1);
    EXPECT_THAT(collector.names, IsEmpty());
    EXPECT_STREQ(allNotes(), "");
}

TEST_F(SoundComponent, IsNotFoundByAnUnknownIdentifier) {
    add(L"goodByHand");
    initialize();
    QrUid almost = goodUid;
    almost.w3 ^= 1; // Another uid with the same hash.
    EXPECT_FALSE(manager->getBuilder(almost));
    EXPECT_FALSE(manager->createObject(almost));
    EXPECT_EQ(noted("entry"), 1);
}

TEST_F(SoundComponent, IsEnumeratedInTheOrderOfTheFileNames) {
    add(L"goodWithKit", L"B" MZ_LIBRARY_EXTENSION);
    add(L"countedDescription", L"c" MZ_LIBRARY_EXTENSION);
    add(L"goodByHand", L"a" MZ_LIBRARY_EXTENSION);
    initialize();
    EXPECT_EQ(names(), (Names{L"Name", L"name", L"third", L"kit", L"counted"}));
}

TEST_F(SoundComponent, EndsAnEnumerationWithAnyVerdictUnchanged) {
    add(L"goodByHand");
    initialize();
    for (const int verdict : {1, 2, 3, -1, 0x40000000}) {
        Collector collector;
        collector.stopAt = 2;
        collector.verdict = static_cast<QrEnum::Action>(verdict);
        collector.atEnd = QrEnum::Stop;
        EXPECT_EQ(manager->enumerateBuilders(collector), verdict);
        EXPECT_EQ(collector.names, (Names{L"Name", L"name"}));
        EXPECT_EQ(collector.timesFinished, 0);
    }
    Collector collector;
    collector.atEnd = static_cast<QrEnum::Action>(77);
    EXPECT_EQ(manager->enumerateBuilders(collector), 77);
    EXPECT_EQ(collector.timesFinished, 1);
}

TEST_F(SoundComponent, ThatTheHostLoadedIsUsedAsItIsAndNeverFreed) {
    const auto file = add(L"goodByHand");
    void* const host = loadAsHost(file);
    ASSERT_TRUE(host);
    initialize();
    EXPECT_EQ(find(file)->module, host);
    EXPECT_FALSE(find(file)->loadedByManager);
    EXPECT_EQ(maker(goodUid), "good");
    EXPECT_EQ(noted("goodLoaded"), 1);
    restart();
    EXPECT_TRUE(isMapped(file));
    EXPECT_EQ(noted("goodUnloaded"), 0);
    // The manager holds no reference, so releasing the host's unloads the library.
    unloadAsHost(host);
    EXPECT_FALSE(isMapped(file));
    EXPECT_EQ(noted("goodUnloaded"), 1);
}

TEST_F(SoundComponent, ThatTheHostLoadedStaysWhenItFails) {
    const auto file = add(L"throwsInEnumerate");
    void* const host = loadAsHost(file);
    ASSERT_TRUE(host);
    initialize();
    EXPECT_THAT(names(), IsEmpty());
    EXPECT_TRUE(isMapped(file));
    EXPECT_EQ(find(file)->module, host);
    EXPECT_FALSE(find(file)->loadedByManager);
    restart();
    EXPECT_TRUE(isMapped(file));
    unloadAsHost(host);
    EXPECT_FALSE(isMapped(file));
}

TEST_F(SoundComponent, ThatTheHostLoadsLaterOutlivesTheManager) {
    const auto file = add(L"goodByHand");
    initialize();
    EXPECT_TRUE(find(file)->loadedByManager);
    void* const host = loadAsHost(file);
    restart();
    EXPECT_TRUE(isMapped(file));
    unloadAsHost(host);
    EXPECT_FALSE(isMapped(file));
}

TEST_F(SoundComponent, IsLoadedOnceByEachOfTwoManagers) {
    const auto file = add(L"goodByHand");
    initialize();
    {
        ComponentManager second;
        second.initialize(searchPathOf(folder.path()).c_str());
        EXPECT_FALSE(second.libraries.front().loadedByManager);
        EXPECT_TRUE(second.createObject(goodUid));
    }
    EXPECT_TRUE(isMapped(file));
    EXPECT_EQ(maker(goodUid), "good");
}

} // namespace
