// SPDX-License-Identifier: BSL-1.0
/// Tests that a faulty component library does no harm to the manager or to other libraries, and
/// what the manager records of it. The faulty libraries are in tests/components; they report events
/// to the test journal.
#include "tests/integration/managerFixture.h"

#include <stdexcept>

using namespace Mz;
using namespace Mz::Test;

namespace {

/// Places a working library before and one after the faulty library in the search order. Both must
/// keep their builders.
class FaultyComponent : public ManagerTest {
  protected:
    FaultyComponent() {
        add(L"countedDescription", L"a" MZ_LIBRARY_EXTENSION);
        add(L"goodWithKit", L"zz" MZ_LIBRARY_EXTENSION);
    }

    /// Initialises with the faulty component and expects it to be unloaded and without builders.
    ComponentLibrary& expectDropped(const std::wstring& component) {
        file = add(component);
        initialize();
        EXPECT_EQ(names(), (Names{L"counted", L"kit"}));
        EXPECT_EQ(maker(countedUid), "counted");
        EXPECT_EQ(maker(kitUid), "kit");
        EXPECT_FALSE(isMapped(file));
        EXPECT_FALSE(indexed(faultyUid));
        EXPECT_FALSE(manager->getBuilder(faultyUid));
        EXPECT_EQ(manager->builderIndex.size(), 2u);
        ComponentLibrary& library = *find(file);
        EXPECT_FALSE(library.module);
        EXPECT_FALSE(library.loadedByManager);
        EXPECT_TRUE(library.builders.empty());
        EXPECT_EQ(noted("itemMade"), noted("itemGone"));
        EXPECT_EQ(noted("objectMade"), noted("objectGone"));
        return library;
    }

    /// Expects that the record has the file's time and size: the library is not tried again until
    /// the file changes.
    void expectNotTriedAgain(ComponentLibrary& library) {
        const std::optional<platform::FileStatus> status = platform::queryFile(file);
        EXPECT_EQ(library.fileTime, status->time);
        EXPECT_EQ(library.fileSize, status->size);
        forgetNotes();
        EXPECT_FALSE(manager->ensureLoaded(library, false));
        EXPECT_FALSE(manager->ensureLoaded(library, true));
        EXPECT_STREQ(allNotes(), "");
        EXPECT_FALSE(isMapped(file));
    }

    /// Expects that the record has neither time nor size, as after an exception: the library is
    /// tried again.
    void expectTriedAgain(ComponentLibrary& library) {
        EXPECT_EQ(library.fileTime, 0u);
        EXPECT_EQ(library.fileSize, 0);
        EXPECT_FALSE(manager->ensureLoaded(library, false));
        EXPECT_FALSE(isMapped(file));
        EXPECT_TRUE(library.builders.empty());
    }

    std::filesystem::path file;
};

TEST_F(FaultyComponent, WithoutEntryPointIsNeverLoadedAndItsInitialiserNeverRuns) {
    const std::filesystem::path mark = folder.path() / "mark";
    setEnvironment("MZ_TEST_MARK", mark.string());
    expectNotTriedAgain(expectDropped(L"noEntryPoint"));
    EXPECT_FALSE(std::filesystem::exists(mark));
    // Control: loading the library runs its initialiser, which writes the mark.
    void* const host = loadAsHost(file);
    ASSERT_TRUE(host);
    EXPECT_TRUE(std::filesystem::exists(mark));
    unloadAsHost(host);
}

TEST_F(FaultyComponent, WithoutEntryPointThatTheHostLoadedIsLeftAlone) {
    file = add(L"noEntryPoint");
    void* const host = loadAsHost(file);
    initialize();
    EXPECT_EQ(names(), (Names{L"counted", L"kit"}));
    EXPECT_EQ(find(file)->fileTime, platform::queryFile(file)->time);
    restart();
    EXPECT_TRUE(isMapped(file));
    unloadAsHost(host);
}

TEST_F(FaultyComponent, WithTheEntryPointOnlyInWhatItDependsOnIsNotLoaded) {
    expectNotTriedAgain(expectDropped(L"entryPointInDependency"));
}

TEST_F(FaultyComponent, WithTheEntryPointOnlyInWhatItDependsOnIsNotCalledThroughItThoughLoaded) {
    file = add(L"entryPointInDependency");
    void* const host = loadAsHost(file);
    ASSERT_TRUE(host);
    initialize();
    EXPECT_EQ(names(), (Names{L"counted", L"kit"}));
    EXPECT_FALSE(indexed(faultyUid));
    EXPECT_TRUE(isMapped(file));
    EXPECT_EQ(find(file)->fileTime, platform::queryFile(file)->time);
    unloadAsHost(host);
}

TEST_F(FaultyComponent, MissingADependencyIsPassedOver) {
    expectNotTriedAgain(expectDropped(L"missesDependency"));
}

TEST_F(FaultyComponent, ReturningNullIsUnloaded) {
    expectNotTriedAgain(expectDropped(L"nullDescription"));
}

TEST_F(FaultyComponent, ReturningAnotherKindOfObjectIsUnloadedAndTheObjectGivenBack) {
    ComponentLibrary& library = expectDropped(L"wrongInterface");
    expectNotTriedAgain(library);
}

TEST_F(FaultyComponent, ThrowingInItsEntryPointIsUnloaded) {
    expectTriedAgain(expectDropped(L"throwsInEntryPoint"));
}

TEST_F(FaultyComponent, ThrowingInEnumerateIsUnloadedOnlyAfterItsExceptionIsGone) {
    ComponentLibrary& library = expectDropped(L"throwsInEnumerate");
    EXPECT_GE(noted("exceptionGone"), 1);
    EXPECT_EQ(noted("throwerUnloaded"), 1);
    const std::string events = allNotes();
    EXPECT_LT(events.rfind("exceptionGone"), events.rfind("throwerUnloaded"));
    expectTriedAgain(library);
}

TEST_F(FaultyComponent, ThrowingTakesAnotherLibrarysIdentifierWithItFromTheIndex) {
    // It registers a builder with the uid of the other library. Dropping it removes that uid from
    // the index.
    const auto good = add(L"goodByHand", L"b" MZ_LIBRARY_EXTENSION);
    file = add(L"throwsInEnumerate");
    initialize();
    EXPECT_FALSE(indexed(goodUid));
    EXPECT_TRUE(indexed(goodSecondUid));
    EXPECT_EQ(names(), (Names{L"counted", L"Name", L"name", L"third", L"kit"}));
}

TEST_F(FaultyComponent, ThrowingInItsLabelIsUnloaded) {
    expectTriedAgain(expectDropped(L"throwsInLabel"));
}

TEST_F(FaultyComponent, ThrowingInItsCountIsUnloaded) {
    expectTriedAgain(expectDropped(L"throwsInCount"));
}

TEST_F(FaultyComponent, ThrowingInTheTextOfAnItemIsUnloaded) {
    expectTriedAgain(expectDropped(L"throwsInText"));
}

TEST_F(FaultyComponent, ThrowingInTheReleaseOfTheEntryPointsReferenceIsUnloaded) {
    ComponentLibrary& library = expectDropped(L"throwsInFirstRelease");
    // Both references were released, and the exception was destroyed before the library was
    // unloaded.
    EXPECT_EQ(noted("taken"), 2);
    EXPECT_EQ(noted("released"), 2);
    EXPECT_EQ(noted("enumerate"), 1); // The working library before it.
    EXPECT_EQ(noted("exceptionMade"), noted("exceptionGone"));
    const std::string events = allNotes();
    EXPECT_LT(events.rfind("exceptionGone"), events.rfind("throwerUnloaded"));
    expectTriedAgain(library);
}

TEST_F(FaultyComponent, ThrowingInTheReleaseAfterItsBuildersAreRecordedLosesThem) {
    ComponentLibrary& library = expectDropped(L"throwsInSecondRelease");
    EXPECT_EQ(noted("released"), 2);
    EXPECT_EQ(noted("exceptionMade"), 1);
    EXPECT_EQ(noted("exceptionGone"), 1);
    const std::string events = allNotes();
    EXPECT_LT(events.rfind("exceptionGone"), events.rfind("throwerUnloaded"));
    expectTriedAgain(library);
}

TEST_F(FaultyComponent, ThrowingInReleaseKeepsTheTimeAndSizeOfItsRecord) {
    file = add(L"throwsInSecondRelease");
    ComponentLibrary& recorded = record(file, false);
    recorded.fileTime = 12345;
    recorded.fileSize = 678;
    initialize();
    EXPECT_EQ(find(file), &recorded);
    EXPECT_EQ(recorded.fileTime, 12345u);
    EXPECT_EQ(recorded.fileSize, 678);
}

TEST_F(FaultyComponent, ThrowingInTheReleaseOfAnItemIsUnloadedWithAllItsBuilders) {
    expectTriedAgain(expectDropped(L"throwsInItemRelease"));
}

TEST_F(FaultyComponent, OfferingNullIsUnloadedWithAllItsBuilders) {
    expectTriedAgain(expectDropped(L"offersNull"));
}

TEST_F(FaultyComponent, OfferingAnotherKindOfItemIsUnloadedWithAllItsBuilders) {
    expectTriedAgain(expectDropped(L"offersWrongItem"));
}

TEST_F(FaultyComponent, KeepsTheTimeAndSizeOfItsRecordWhenItThrows) {
    file = add(L"throwsInEnumerate");
    ComponentLibrary& recorded = record(file, false);
    recorded.fileTime = 12345;
    recorded.fileSize = 678;
    initialize();
    EXPECT_EQ(find(file), &recorded);
    EXPECT_EQ(recorded.fileTime, 12345u);
    EXPECT_EQ(recorded.fileSize, 678);
}

class LyingAboutItsCount : public ManagerTest,
                           public ::testing::WithParamInterface<const wchar_t*> {};

TEST_P(LyingAboutItsCount, HasEveryBuilderRecordedAndIndexed) {
    const auto file = add(GetParam());
    initialize();
    EXPECT_EQ(noted("counted"), 1);
    const ComponentLibrary* library = find(file);
    ASSERT_TRUE(library);
    ASSERT_EQ(library->builders.size(), howManyMiscounted);
    for (std::uint32_t index = 0; index < howManyMiscounted; ++index) {
        const ComponentManager::Builder& builder = library->builders[index];
        EXPECT_EQ(builder.getNumber(), index);
        EXPECT_EQ(indexed(testUid(firstOfMiscounted + index)), &builder);
        EXPECT_EQ(maker(builder.getUid()), "liar");
    }
}

INSTANTIATE_TEST_SUITE_P(FaultyComponent, LyingAboutItsCount,
                         ::testing::Values(L"liesAboutCountZero", L"liesAboutCountLow",
                                           L"liesAboutCountHuge"),
                         [](const auto& parameter) {
                             return std::string("Case") + std::to_string(parameter.index);
                         });

TEST_F(FaultyComponent, FailingAtTheEndOfItsEnumerationKeepsItsBuilders) {
    add(L"enumerateFails");
    initialize();
    EXPECT_EQ(names(), (Names{L"counted", L"fails", L"kit"}));
    EXPECT_EQ(maker(faultyUid), "fails");
}

TEST_F(FaultyComponent, GivingNullTextsHasThemRecordedAsEmpty) {
    file = add(L"nullTexts");
    initialize();
    const ComponentManager::Builder* builder = indexed(nullTextsUid);
    ASSERT_TRUE(builder);
    EXPECT_STREQ(builder->getName(), L"");
    EXPECT_STREQ(builder->getLabel(), L"");
    EXPECT_STREQ(builder->getText(), L"");
    EXPECT_STREQ(builder->getComponentLabel(), L"");
    EXPECT_STREQ(builder->getComponentText(), L"");
    EXPECT_EQ(builder->getNumber(), 5u);
    EXPECT_TRUE(builder->getFlag());
}

TEST_F(FaultyComponent, WithOneIdentifierTwiceIsIndexedByTheLastRegistered) {
    file = add(L"duplicateUids");
    initialize();
    const ComponentLibrary* library = find(file);
    ASSERT_EQ(library->builders.size(), 2u);
    EXPECT_EQ(indexed(duplicateUid), &library->builders[1]);
    EXPECT_EQ(names(), (Names{L"counted", L"first", L"second", L"kit"}));
}

TEST_F(FaultyComponent, SharingAnIdentifierWithAnotherYieldsToTheLaterOne) {
    add(L"sharesUidFirst", L"m1" MZ_LIBRARY_EXTENSION);
    add(L"sharesUidSecond", L"m2" MZ_LIBRARY_EXTENSION);
    initialize();
    EXPECT_EQ(maker(sharedUid), "second");
    EXPECT_EQ(maker(firstSharerUid), "first");
    EXPECT_EQ(names(), (Names{L"counted", L"first", L"own", L"second", L"own", L"kit"}));
}

TEST_F(FaultyComponent, SharingAnIdentifierYieldsToTheLaterDirectoryToo) {
    TemporaryDirectory second;
    const auto name = builtComponent(L"sharesUidFirst").filename();
    std::filesystem::copy_file(builtComponent(L"sharesUidFirst"), second.path() / name);
    add(L"sharesUidSecond", L"m2" MZ_LIBRARY_EXTENSION);
    manager->initialize((searchPathOf(folder.path()) + L";" + searchPathOf(second.path())).c_str());
    EXPECT_EQ(maker(sharedUid), "first");
}

TEST_F(FaultyComponent, ThatCreatesNoBuilderGivesNull) {
    file = add(L"createsNull");
    initialize();
    EXPECT_FALSE(manager->getBuilder(createsNullUid));
    EXPECT_FALSE(manager->createObject(createsNullUid));
    EXPECT_FALSE(indexed(createsNullUid)->getBuilder());
    EXPECT_TRUE(isMapped(file));
}

TEST_F(FaultyComponent, ThatCreatesAnotherKindOfBuilderGivesNullAndLeaksNothing) {
    file = add(L"createsWrongObject");
    initialize();
    EXPECT_FALSE(manager->getBuilder(createsWrongUid));
    EXPECT_FALSE(manager->createObject(createsWrongUid));
    EXPECT_EQ(noted("objectMade"), 2);
    EXPECT_EQ(noted("objectGone"), 2);
}

TEST_F(FaultyComponent, ThatThrowsWhenItCreatesABuilderPassesThatToTheClientAndStaysUsable) {
    file = add(L"throwsInCreate");
    initialize();
    EXPECT_THROW(manager->getBuilder(createThrowsUid), std::runtime_error);
    EXPECT_THROW(manager->createObject(createThrowsUid), std::runtime_error);
    EXPECT_TRUE(isMapped(file));
    EXPECT_TRUE(find(file)->loadedByManager);
    EXPECT_EQ(names(), (Names{L"counted", L"create throws", L"kit"}));
}

TEST_F(FaultyComponent, ThatThrowsInReleaseForABuilderPassesThatToTheClientAndStaysUsable) {
    file = add(L"throwsInThirdRelease");
    initialize();
    EXPECT_EQ(names(), (Names{L"counted", L"release throws", L"kit"}));
    forgetNotes();
    EXPECT_THROW(manager->getBuilder(faultyUid), std::runtime_error);
    EXPECT_EQ(noted("builderMade"), 0); // It throws before it creates the builder.
    EXPECT_EQ(noted("taken"), 2);
    EXPECT_EQ(noted("released"), 2);
    EXPECT_THROW(manager->createObject(faultyUid), std::runtime_error);
    EXPECT_TRUE(isMapped(file));
    EXPECT_TRUE(find(file)->loadedByManager);
    EXPECT_EQ(names(), (Names{L"counted", L"release throws", L"kit"}));
}

TEST_F(FaultyComponent, ThatThrowsInReleaseAfterItMadeABuilderLeaksNone) {
    file = add(L"throwsInFourthRelease");
    initialize();
    forgetNotes();
    EXPECT_THROW(manager->getBuilder(faultyUid), std::runtime_error);
    EXPECT_EQ(noted("builderMade"), 1);
    EXPECT_EQ(noted("builderGone"), 1);
    EXPECT_TRUE(isMapped(file));
}

TEST_F(FaultyComponent, ThatUsesTheManagerWhileItIsRecordedFindsItNotYetInitialised) {
    add(L"goodByHand");
    file = add(L"reentrant");
    const std::wstring path = searchPathOf(folder.path());
    setManagerUnderTest(manager.get());
    setSearchPathUnderTest(path.c_str());
    initialize();
    EXPECT_EQ(names(), (Names{L"counted", L"Name", L"name", L"third", L"reentrant", L"kit"}));
    EXPECT_EQ(noted("gotObject"), 0);
    EXPECT_EQ(noted("gotBuilder"), 0);
    EXPECT_EQ(noted("sawBuilder"), 0);
    EXPECT_EQ(noted("walked"), 3);
    forgetNotes();
    EXPECT_EQ(maker(reentrantUid), "reentrant");
    EXPECT_EQ(noted("gotObject"), 1);
    EXPECT_EQ(noted("sawBuilder"), 6);
    EXPECT_EQ(manager->libraries.size(), 4u);
}

TEST_F(FaultyComponent, ThatInitialisesTheManagerWhileUnloadedFindsItGone) {
    file = add(L"initializesAtEnd");
    initialize();
    EXPECT_TRUE(indexed(finaliserUid));
    const std::wstring path = searchPathOf(folder.path());
    setManagerUnderTest(manager.get());
    setSearchPathUnderTest(path.c_str());
    forgetNotes();
    manager.reset();
    setManagerUnderTest(nullptr);
    EXPECT_EQ(noted("ended"), 1);
    EXPECT_EQ(noted("enumerate"), 0); // No library was enumerated again.
    EXPECT_FALSE(isMapped(file));
}

} // namespace
