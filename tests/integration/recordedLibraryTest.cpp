// SPDX-License-Identifier: BSL-1.0
/// Tests what a start does with the library records of an earlier start. The tests write the
/// records themselves.
#include "components/componentManager/binaryStream.h"
#include "components/componentManager/bufferio.h"
#include "tests/integration/managerFixture.h"

#include <chrono>
#include <iterator>
#include <sstream>

using namespace Mz;
using namespace Mz::Test;
using ::testing::IsEmpty;

namespace {

class RecordedLibrary : public ManagerTest {
  protected:
    /// Changes the file's modification time.
    static void touch(const std::filesystem::path& file) {
        std::filesystem::last_write_time(file, std::filesystem::last_write_time(file) -
                                                   std::chrono::hours(1));
    }
};

TEST_F(RecordedLibrary, UnchangedIsNotLoadedButListedAsRecorded) {
    const auto file = add(L"goodByHand");
    ComponentLibrary& library = record(file);
    ComponentManager::Builder& builder = recordBuilder(library, goodUid, L"as recorded");
    initialize();
    EXPECT_FALSE(isMapped(file));
    EXPECT_STREQ(allNotes(), "");
    EXPECT_FALSE(library.module);
    EXPECT_EQ(names(), (Names{L"as recorded"}));
    EXPECT_EQ(indexed(goodUid), &builder);
    ASSERT_EQ(manager->libraries.size(), 1u);
    EXPECT_EQ(&manager->libraries.front(), &library);
}

TEST_F(RecordedLibrary, UnchangedIsLoadedOnFirstUseAndStaysLoaded) {
    const auto file = add(L"goodByHand");
    ComponentLibrary& library = record(file);
    ComponentManager::Builder& builder = recordBuilder(library, goodUid, L"as recorded");
    initialize();
    EXPECT_EQ(maker(goodUid), "good");
    EXPECT_TRUE(isMapped(file));
    EXPECT_TRUE(library.loadedByManager);
    // Its builders are still the recorded ones: the library was not enumerated.
    EXPECT_EQ(noted("enumerate"), 0);
    EXPECT_EQ(indexed(goodUid), &builder);
    EXPECT_EQ(names(), (Names{L"as recorded"}));
    // A lazy load does not read the library's texts.
    EXPECT_STREQ(builder.getComponentLabel(), L"");
    EXPECT_STREQ(builder.getComponentText(), L"");
    EXPECT_EQ(library.descriptionValue, 0);
    EXPECT_EQ(maker(goodUid), "good");
    EXPECT_EQ(noted("goodLoaded"), 1);
    EXPECT_EQ(noted("entry"), 2);
    restart();
    EXPECT_FALSE(isMapped(file));
}

TEST_F(RecordedLibrary, UnchangedThatTheHostLoadedIsUsedLazilyAndNotFreed) {
    const auto file = add(L"goodByHand");
    recordBuilder(record(file), goodUid, L"as recorded");
    void* const host = loadAsHost(file);
    initialize();
    EXPECT_EQ(noted("entry"), 0);
    EXPECT_EQ(maker(goodUid), "good");
    EXPECT_FALSE(manager->libraries.front().loadedByManager);
    restart();
    EXPECT_TRUE(isMapped(file));
    unloadAsHost(host);
}

TEST_F(RecordedLibrary, OfARelativeFolderIsDroppedOnUseIfTheCurrentFolderHasChanged) {
    const std::filesystem::path here = std::filesystem::current_path();
    std::filesystem::create_directory(folder.path() / "plugins");
    std::filesystem::rename(add(L"goodWithKit"), folder.path() / "plugins" / "kit");
    std::filesystem::current_path(folder.path());
    manager->initialize(L"plugins");
    EXPECT_EQ(maker(kitUid), "kit");
    std::stringstream list;
    {
        QrOutBuffer bytes(&list);
        QrBinaryStream stream(&bytes);
        manager->writeRecords(stream);
    }
    restart();
    {
        QrInBuffer bytes(&list);
        QrBinaryStream stream(&bytes);
        manager->readRecords(stream);
    }
    manager->initialize(L"plugins");
    EXPECT_TRUE(indexed(kitUid));
    std::filesystem::current_path(here);
    EXPECT_FALSE(manager->createObject(kitUid));
    EXPECT_THAT(names(), IsEmpty());
}

TEST_F(RecordedLibrary, UnchangedWithoutBuildersIsNeverTried) {
    const auto file = add(L"goodByHand");
    ComponentLibrary& library = record(file);
    initialize();
    EXPECT_FALSE(manager->ensureLoaded(library, true));
    EXPECT_FALSE(manager->ensureLoaded(library, false));
    EXPECT_FALSE(isMapped(file));
    EXPECT_THAT(names(), IsEmpty());
    EXPECT_STREQ(allNotes(), "");
}

TEST_F(RecordedLibrary, UnchangedThatIsNoLibraryIsDroppedOnUse) {
    const auto file = folder.write("text", "no library at all");
    ComponentLibrary& library = record(file);
    const ComponentManager::Builder& builder = recordBuilder(library, faultyUid, L"faulty");
    initialize();
    EXPECT_EQ(names(), (Names{L"faulty"}));
    EXPECT_FALSE(manager->getBuilder(faultyUid));
    EXPECT_THAT(names(), IsEmpty());
    EXPECT_FALSE(indexed(faultyUid));
    EXPECT_STREQ(builder.getName(), L"faulty"); // A held record stays readable.
    EXPECT_EQ(library.fileTime, platform::queryFile(file)->time);
    EXPECT_EQ(library.fileSize, 17);
}

TEST_F(RecordedLibrary, UnchangedThatNoLongerDescribesItselfGivesNullAndKeepsItsRecords) {
    const auto file = add(L"nullDescription");
    recordBuilder(record(file), faultyUid, L"faulty");
    initialize();
    EXPECT_FALSE(manager->getBuilder(faultyUid));
    EXPECT_EQ(names(), (Names{L"faulty"}));
}

TEST_F(RecordedLibrary, ChangedInTimeIsReadAfresh) {
    const auto file = add(L"changingTwo", "changing");
    ComponentLibrary& library = record(file);
    recordBuilder(library, changingUid, L"as recorded");
    recordBuilder(library, goodUid, L"no longer there");
    touch(file);
    initialize();
    EXPECT_EQ(names(), (Names{L"version two", L"new in two"}));
    EXPECT_FALSE(indexed(goodUid));
    EXPECT_STREQ(indexed(changingUid)->getComponentLabel(), L"Label two");
    EXPECT_EQ(library.fileTime, platform::queryFile(file)->time);
}

TEST_F(RecordedLibrary, ChangedInSizeAloneIsReadAfresh) {
    const auto file = add(L"changingTwo", "changing");
    ComponentLibrary& library = record(file);
    recordBuilder(library, changingUid, L"as recorded");
    library.fileSize += 0x100000000; // The low 32 bits stay equal.
    initialize();
    EXPECT_EQ(names(), (Names{L"version two", L"new in two"}));
    EXPECT_EQ(library.fileSize, static_cast<int64>(std::filesystem::file_size(file)));
}

TEST_F(RecordedLibrary, OfAnotherVersionIsReplacedByTheFilesOwnWords) {
    const auto file = add(L"changingOne", "changing");
    initialize();
    EXPECT_EQ(names(), (Names{L"version one"}));
    const ComponentLibrary& before = *find(file);
    const std::uint32_t time = before.fileTime;
    const int64 size = before.fileSize;
    restart();
    add(L"changingTwo", "changing");
    touch(file);
    ComponentLibrary& library = record(file, false);
    library.fileTime = time;
    library.fileSize = size;
    recordBuilder(library, changingUid, L"version one");
    initialize();
    EXPECT_EQ(names(), (Names{L"version two", L"new in two"}));
    EXPECT_EQ(maker(changingSecondUid), "changing");
}

TEST_F(RecordedLibrary, ChangedBetweenInitializeAndFirstUseIsReadAfreshThen) {
    const auto file = add(L"changingOne", "changing");
    ComponentLibrary& library = record(file);
    const ComponentManager::Builder& held = recordBuilder(library, changingUid, L"as recorded");
    initialize();
    add(L"changingTwo", "changing");
    touch(file);
    EXPECT_EQ(maker(changingUid), "changing");
    EXPECT_EQ(names(), (Names{L"version two", L"new in two"}));
    EXPECT_STREQ(held.getName(), L"as recorded");
    EXPECT_STREQ(held.getComponentLabel(), L"Label two"); // Read from the library's record.
}

TEST_F(RecordedLibrary, ChangedUnderARecordsOwnCallLeavesTheRecordReadable) {
    const auto file = add(L"changingOne", "changing");
    ComponentManager::Builder& held = recordBuilder(record(file), changingUid, L"as recorded");
    initialize();
    std::filesystem::remove(file);
    EXPECT_FALSE(held.getBuilder());
    EXPECT_FALSE(std::as_const(held).getBuilder());
    EXPECT_STREQ(held.getName(), L"as recorded");
    EXPECT_EQ(held.getUid(), changingUid);
    EXPECT_THAT(names(), IsEmpty());
    EXPECT_FALSE(indexed(changingUid));
}

TEST_F(RecordedLibrary, ChangedUnderAnEnumerationLeavesItsItemsReadable) {
    class Dropper final : public QrEnumerator<QrCPtr<QrBuilderDescription>> {
      public:
        explicit Dropper(const std::filesystem::path& file) : file(file) {}
        Action process(QrCPtr<QrBuilderDescription> item) override {
            std::filesystem::remove(file);
            builderGiven = builderGiven || item->getBuilder();
            names.emplace_back(item->getName());
            items.push_back(item);
            return Continue;
        }
        const std::filesystem::path& file;
        bool builderGiven = false;
        Names names;
        std::vector<QrCPtr<QrBuilderDescription>> items;
    };
    const auto file = add(L"changingOne", "changing");
    const auto other = add(L"goodByHand", "other");
    ComponentLibrary& library = record(file);
    recordBuilder(library, changingUid, L"one");
    recordBuilder(library, changingSecondUid, L"two");
    recordBuilder(record(other), goodUid, L"three");
    initialize();
    Dropper dropper(file);
    EXPECT_EQ(manager->enumerateBuilders(dropper), QrEnum::Continue);
    EXPECT_EQ(dropper.names.front(), L"one");
    EXPECT_EQ(dropper.names.back(), L"three");
    EXPECT_STREQ(dropper.items.front()->getName(), L"one");
    EXPECT_STREQ(dropper.items.front()->getComponentLabel(), L"");
    // Later enumerations see only the builder of the other library.
    EXPECT_EQ(names(), (Names{L"three"}));
    EXPECT_FALSE(indexed(changingSecondUid));
}

TEST_F(RecordedLibrary, ReplacedUnderAnEnumerationShowsNoRecordTwice) {
    class Replacer final : public QrEnumerator<QrCPtr<QrBuilderDescription>> {
      public:
        Action process(QrCPtr<QrBuilderDescription> item) override {
            if (names.empty())
                item->getBuilder();
            names.emplace_back(item->getName());
            return Continue;
        }
        Names names;
    };
    const auto file = add(L"changingTwo", "changing");
    ComponentLibrary& library = record(file);
    recordBuilder(library, changingUid, L"one");
    initialize();
    touch(file);
    Replacer replacer;
    manager->enumerateBuilders(replacer);
    EXPECT_EQ(replacer.names, (Names{L"one", L"new in two"}));
}

TEST_F(RecordedLibrary, NoLongerThereIsForgotten) {
    const auto file = folder.path() / "gone";
    ComponentLibrary& library = record(file, false);
    recordBuilder(library, goodUid, L"gone");
    add(L"goodWithKit");
    initialize();
    EXPECT_EQ(names(), (Names{L"kit"}));
    EXPECT_FALSE(indexed(goodUid));
    EXPECT_EQ(manager->libraries.size(), 1u);
}

TEST_F(RecordedLibrary, OfAFolderNoLongerSearchedIsForgotten) {
    TemporaryDirectory elsewhere;
    const auto file = elsewhere.write("file", "content");
    recordBuilder(record(file), goodUid, L"elsewhere");
    add(L"goodWithKit");
    initialize();
    EXPECT_EQ(names(), (Names{L"kit"}));
    EXPECT_FALSE(indexed(goodUid));
}

TEST_F(RecordedLibrary, FoundAgainUnderAnotherLetterCaseKeepsItsBuilders) {
    const auto file = add(L"goodByHand", "GoOd");
    ComponentLibrary& library = record(file);
    EXPECT_EQ(library.fileName, L"good");
    library.foundPath.clear(); // Not stored, so empty in a record that was read.
    recordBuilder(library, goodUid, L"as recorded");
    initialize();
    EXPECT_EQ(names(), (Names{L"as recorded"}));
    EXPECT_FALSE(isMapped(file));
    // The manager opens the file by its real name.
    EXPECT_EQ(maker(goodUid), "good");
}

TEST_F(RecordedLibrary, TakesThePlaceOfTheNewRecordInTheOrderOfTheFiles) {
    const auto a = add(L"goodByHand", "a");
    const auto b = add(L"goodWithKit", "b");
    const auto c = add(L"countedDescription", "c");
    const auto d = add(L"changingOne", "d");
    // An earlier start with another search path recorded them in another order.
    ComponentLibrary& third = record(c);
    recordBuilder(third, countedUid, L"from c");
    ComponentLibrary& gone = record(folder.path() / "gone", false);
    recordBuilder(gone, goodUid, L"gone");
    ComponentLibrary& first = record(a);
    ComponentManager::Builder& held = recordBuilder(first, goodUid, L"from a");
    initialize();
    EXPECT_EQ(names(), (Names{L"from a", L"kit", L"from c", L"version one"}));
    ASSERT_EQ(manager->libraries.size(), 4u);
    EXPECT_EQ(&manager->libraries.front(), &first);
    EXPECT_EQ(&*std::next(manager->libraries.begin(), 2), &third);
    EXPECT_EQ(indexed(goodUid), &held);
    EXPECT_EQ(held.library, &first);
    EXPECT_EQ(&first.builders.front(), &held);
}

TEST_F(RecordedLibrary, ReindexesSoThatTheFirstOfOneIdentifierWinsInsideOneLibrary) {
    const auto file = add(L"duplicateUids");
    ComponentLibrary& library = record(file);
    ComponentManager::Builder& first = recordBuilder(library, duplicateUid, L"first");
    recordBuilder(library, duplicateUid, L"second");
    initialize();
    EXPECT_EQ(indexed(duplicateUid), &first);
    EXPECT_EQ(names(), (Names{L"first", L"second"}));
    EXPECT_FALSE(isMapped(file));
}

TEST_F(RecordedLibrary, ReindexesSoThatTheLaterLibraryWinsAcrossTwo) {
    ComponentLibrary& one = record(add(L"sharesUidFirst", "one"));
    ComponentLibrary& two = record(add(L"sharesUidSecond", "two"));
    recordBuilder(one, sharedUid, L"first");
    ComponentManager::Builder& later = recordBuilder(two, sharedUid, L"second");
    initialize();
    EXPECT_EQ(indexed(sharedUid), &later);
    EXPECT_EQ(maker(sharedUid), "second");
    // Indexing the first library again gives it the uid: the last registration wins.
    manager->reindexBuilders(one);
    EXPECT_EQ(indexed(sharedUid), &one.builders.front());
}

TEST_F(RecordedLibrary, ReindexedAfterANewOneReplacesItWhereItIsLaterInTheList) {
    add(L"sharesUidFirst", "one");
    ComponentManager::Builder& later =
        recordBuilder(record(add(L"sharesUidSecond", "two")), sharedUid, L"second");
    initialize();
    EXPECT_EQ(indexed(sharedUid), &later);
}

TEST_F(RecordedLibrary, DroppedTakesItsIdentifiersOutOfTheIndexWhoeverWonThem) {
    ComponentLibrary& one = record(add(L"sharesUidFirst", "one"));
    ComponentLibrary& two = record(add(L"sharesUidSecond", "two"));
    recordBuilder(one, sharedUid, L"first");
    recordBuilder(one, firstSharerUid, L"own");
    recordBuilder(two, sharedUid, L"second");
    recordBuilder(two, secondSharerUid, L"own");
    initialize();
    manager->dropBuilders(one); // `two` owns the shared uid.
    EXPECT_FALSE(indexed(sharedUid));
    EXPECT_FALSE(indexed(firstSharerUid));
    EXPECT_TRUE(indexed(secondSharerUid));
    EXPECT_TRUE(one.builders.empty());
    EXPECT_EQ(names(), (Names{L"second", L"own"}));
    EXPECT_FALSE(manager->getBuilder(sharedUid));
}

TEST_F(RecordedLibrary, RemovedAfterItWonAnIdentifierLeavesTheOtherListedButNotFound) {
    const auto fileTwo = add(L"sharesUidSecond", "two");
    ComponentLibrary& one = record(add(L"sharesUidFirst", "one"));
    ComponentLibrary& two = record(fileTwo);
    recordBuilder(one, sharedUid, L"first");
    recordBuilder(two, sharedUid, L"second");
    initialize();
    std::filesystem::remove(fileTwo);
    EXPECT_FALSE(manager->ensureLoaded(two, false));
    EXPECT_FALSE(indexed(sharedUid));
    EXPECT_EQ(names(), (Names{L"first"}));
}

TEST_F(RecordedLibrary, DroppedTwiceOrEmptyChangesNothing) {
    ComponentLibrary& one = record(add(L"sharesUidFirst", "one"));
    ComponentLibrary& two = record(add(L"sharesUidSecond", "two"));
    recordBuilder(one, sharedUid, L"first");
    initialize();
    manager->dropBuilders(one);
    recordBuilder(two, sharedUid, L"second");
    manager->reindexBuilders(two);
    manager->dropBuilders(one);
    EXPECT_EQ(indexed(sharedUid), &two.builders.front());
}

TEST_F(RecordedLibrary, EnsureLoadedAnswersByTheBuildersWhenTheModuleIsThere) {
    const auto file = add(L"goodByHand");
    initialize();
    ComponentLibrary& library = *find(file);
    forgetNotes();
    EXPECT_TRUE(manager->ensureLoaded(library, false));
    EXPECT_TRUE(manager->ensureLoaded(library, true));
    manager->dropBuilders(library);
    EXPECT_FALSE(manager->ensureLoaded(library, false));
    EXPECT_FALSE(manager->ensureLoaded(library, true));
    EXPECT_STREQ(allNotes(), "");
    EXPECT_TRUE(isMapped(file));
}

TEST_F(RecordedLibrary, UnloadGivesBackWhatTheManagerLoadedAndLeavesTheRest) {
    const auto file = add(L"goodByHand");
    initialize();
    ComponentLibrary& library = *find(file);
    manager->unload(library);
    EXPECT_FALSE(isMapped(file));
    EXPECT_FALSE(library.module);
    EXPECT_FALSE(library.loadedByManager);
    manager->unload(library); // A no-op.
    // Its builders are still recorded, so it is loaded again when it is needed.
    EXPECT_EQ(maker(goodUid), "good");
    EXPECT_TRUE(isMapped(file));
}

TEST_F(RecordedLibrary, GetDescriptionLoadsALibraryThatIsNew) {
    const auto file = add(L"goodByHand");
    ComponentLibrary& library = record(file, false);
    const QrPtr<QrComponentDescription> description = manager->getDescription(library);
    ASSERT_TRUE(description);
    EXPECT_EQ(description->getBuilderCount(), 3u);
    EXPECT_EQ(library.builders.size(), 3u);
}

TEST_F(RecordedLibrary, GetDescriptionOfOneThatStaysUnloadedIsNull) {
    ComponentLibrary& library = record(add(L"goodByHand"));
    recordBuilder(library, goodUid, L"as recorded");
    EXPECT_FALSE(manager->getDescription(library));
    EXPECT_FALSE(library.module);
    ComponentLibrary& none = record(add(L"noEntryPoint"), false);
    EXPECT_FALSE(manager->getDescription(none));
    EXPECT_FALSE(manager->getComponentBuilder(none, goodUid));
}

TEST_F(RecordedLibrary, ThatAsksForItselfWhileItIsLoadedIsLoadedOnce) {
    const auto file = add(L"reentrantInitialiser");
    ComponentLibrary& library = record(file);
    recordBuilder(library, reentrantInitialiserUid, L"as recorded");
    initialize();
    setManagerUnderTest(manager.get());
    EXPECT_TRUE(manager->getBuilder(reentrantInitialiserUid));
    setManagerUnderTest(nullptr);
    EXPECT_EQ(noted("asked"), 1);
    EXPECT_TRUE(library.loadedByManager);
    restart();
    EXPECT_FALSE(isMapped(file));
}

ComponentManager::Builder* heldRecord = nullptr;

/// Calls `getBuilder` on the held record while its library is being loaded.
void useHeldRecord(const char* event) {
    if (std::string(event) == "asked" && heldRecord->getBuilder())
        note("answeredThroughRecord");
}

TEST_F(RecordedLibrary, ChangedThatUsesAHeldRecordWhileItIsLoadedIsRegisteredOnce) {
    const auto file = add(L"reentrantInitialiser");
    ComponentLibrary& library = record(file);
    heldRecord = &recordBuilder(library, reentrantInitialiserUid, L"as recorded");
    initialize();
    touch(file);
    setManagerUnderTest(manager.get());
    setHook(useHeldRecord);
    EXPECT_TRUE(heldRecord->getBuilder());
    setHook(nullptr);
    setManagerUnderTest(nullptr);
    EXPECT_EQ(noted("answeredThroughRecord"), 1);
    EXPECT_EQ(noted("enumerate"), 1);
    EXPECT_EQ(names(), (Names{L"initialiser"}));
    ASSERT_EQ(library.builders.size(), 1u);
    EXPECT_EQ(indexed(reentrantInitialiserUid), &library.builders.front());
    EXPECT_EQ(library.fileTime, platform::queryFile(file)->time);
    EXPECT_TRUE(library.loadedByManager);
    EXPECT_EQ(maker(reentrantInitialiserUid), "initialiser");
    restart();
    EXPECT_FALSE(isMapped(file));
}

ComponentManager* starting = nullptr;
std::istringstream* listDuringStart = nullptr;

/// Reads a list while the manager starts.
void readList(const char* event) {
    if (std::string(event) != "enumerate" || !starting)
        return;
    QrInBuffer io(listDuringStart);
    QrBinaryStream stream(&io);
    starting->readRecords(stream);
}

TEST_F(RecordedLibrary, IsNotReadDuringTheStart) {
    add(L"countedDescription");
    initialize();
    std::ostringstream list;
    {
        QrOutBuffer io(&list);
        QrBinaryStream stream(&io);
        manager->writeRecords(stream);
    }
    restart();
    std::istringstream input(list.str());
    listDuringStart = &input;
    starting = manager.get();
    setHook(readList);
    initialize();
    setHook(nullptr);
    starting = nullptr;
    listDuringStart = nullptr;
    EXPECT_EQ(static_cast<std::streamoff>(input.tellg()), 0);
    EXPECT_GE(noted("enumerate"), 2);
    EXPECT_EQ(manager->libraries.size(), 1u);
    EXPECT_EQ(names(), (Names{L"counted"}));
}

std::vector<const ComponentManager::Builder*>* seenWhileGrowing = nullptr;
ComponentManager* growing = nullptr;

/// Looks up the first builder in the index each time that another builder is offered.
void lookAtFirst(const char* event) {
    if (std::string(event) != "itemMade" || !growing)
        return;
    ComponentManager::Builder** found = growing->builderIndex.find(testUid(firstOfMany));
    if (found)
        seenWhileGrowing->push_back(*found);
}

TEST_F(RecordedLibrary, KeepsTheAddressesOfItsRecordsWhileThousandsAreAdded) {
    const auto file = add(L"manyBuilders");
    std::vector<const ComponentManager::Builder*> seen;
    seenWhileGrowing = &seen;
    growing = manager.get();
    setHook(lookAtFirst);
    initialize();
    setHook(nullptr);
    growing = nullptr;
    const ComponentLibrary* library = find(file);
    ASSERT_EQ(library->builders.size(), howMany);
    ASSERT_EQ(seen.size(), howMany - 1);
    for (const ComponentManager::Builder* address : seen)
        ASSERT_EQ(address, &library->builders.front());
    for (std::uint32_t index = 0; index < howMany; ++index) {
        ASSERT_EQ(indexed(testUid(firstOfMany + index)), &library->builders[index]);
        ASSERT_EQ(library->builders[index].getNumber(), index);
    }
    EXPECT_EQ(manager->builderIndex.size(), howMany);
    EXPECT_GE(manager->builderIndex.bucketCount(), howMany);
}

TEST_F(RecordedLibrary, IndexStartsWithEightBucketsAndHashesByTheFirstWord) {
    EXPECT_EQ(UidHash()({0x12345678, 1, 2, 3}), 0x12345678u);
    manager->builderIndex[goodUid] = nullptr;
    EXPECT_EQ(manager->builderIndex.bucketCount(), 8u);
    for (std::uint32_t index = 100; index < 107; ++index)
        manager->builderIndex[testUid(index)] = nullptr;
    EXPECT_EQ(manager->builderIndex.bucketCount(), 8u);
    manager->builderIndex[testUid(200)] = nullptr;
    EXPECT_EQ(manager->builderIndex.bucketCount(), 16u);
    manager->builderIndex.clear();
}

} // namespace
