// SPDX-License-Identifier: BSL-1.0
/// Tests the process-wide manager. It initialises only once, so ctest runs each test in a process
/// of its own.
#include "tests/integration/managerFixture.h"

using namespace Mz;
using namespace Mz::Test;
using ::testing::IsEmpty;

namespace {

class ProcessManager : public ManagerTest {
  protected:
    ProcessManager() { manager.reset(); }

    static Names namesOfProcess() {
        Collector collector;
        QrGetComponentManager()->enumerateBuilders(collector);
        return collector.names;
    }

    static ComponentManager& process() {
        return *static_cast<ComponentManager*>(QrGetComponentManager());
    }
};

TEST_F(ProcessManager, IsOneObjectThatAnswersForItsInterfaceAndIsNotCounted) {
    QrComponentManager* const one = QrGetComponentManager();
    ASSERT_TRUE(one);
    EXPECT_EQ(QrGetComponentManager(), one);
    EXPECT_EQ(queryCast<QrComponentManager>(one).get(), one);
    EXPECT_EQ(one->getCastable(), one);
    EXPECT_EQ(one->newReference(), 1);
    EXPECT_EQ(one->release(), 1);
    one->destroy();
    EXPECT_EQ(QrGetComponentManager(), one);
}

TEST_F(ProcessManager, BeforeInitializeKnowsNothingAndOnlyFinishes) {
    Collector collector;
    collector.atEnd = QrEnum::Stop;
    EXPECT_EQ(QrGetComponentManager()->enumerateBuilders(collector), QrEnum::Stop);
    EXPECT_EQ(collector.timesFinished, 1);
    EXPECT_THAT(collector.names, IsEmpty());
    EXPECT_FALSE(QrGetComponentManager()->getBuilder(goodUid));
    EXPECT_FALSE(QrGetComponentManager()->createObject(goodUid));
    EXPECT_FALSE(process().initialised);
    EXPECT_TRUE(process().libraries.empty());
    EXPECT_EQ(process().builderIndex.size(), 0u);
}

TEST_F(ProcessManager, FindsComponentsAndMakesTheirObjects) {
    add(L"goodByHand");
    add(L"goodWithKit");
    QrGetComponentManager()->initialize(searchPathOf(folder.path()).c_str());
    EXPECT_EQ(namesOfProcess(), (Names{L"Name", L"name", L"third", L"kit"}));
    const QrRef<QrCastable> object = QrGetComponentManager()->createObject(kitUid);
    ASSERT_TRUE(object);
    EXPECT_STREQ(queryCast<PlainObject>(object.get())->maker(), "kit");
}

TEST_F(ProcessManager, IsNotChangedByASecondInitialize) {
    TemporaryDirectory second;
    std::filesystem::copy_file(builtComponent(L"goodWithKit"), second.path() / "kit");
    add(L"goodByHand");
    QrGetComponentManager()->initialize(searchPathOf(folder.path()).c_str());
    QrGetComponentManager()->initialize(searchPathOf(second.path()).c_str());
    QrGetComponentManager()->initialize(nullptr);
    EXPECT_EQ(namesOfProcess(), (Names{L"Name", L"name", L"third"}));
    EXPECT_FALSE(QrGetComponentManager()->getBuilder(kitUid));
}

TEST_F(ProcessManager, IsInitialisedForGoodByAPathThatHoldsNothing) {
    add(L"goodByHand");
    QrGetComponentManager()->initialize(searchPathOf(folder.path() / "nothing").c_str());
    EXPECT_TRUE(process().initialised);
    QrGetComponentManager()->initialize(searchPathOf(folder.path()).c_str());
    EXPECT_THAT(namesOfProcess(), IsEmpty());
}

TEST_F(ProcessManager, WhenALibraryInitialisesItStaysWithTheFirstPath) {
    TemporaryDirectory second;
    std::filesystem::copy_file(builtComponent(L"goodWithKit"), second.path() / "kit");
    const std::wstring other = searchPathOf(second.path());
    add(L"reentrant");
    setManagerUnderTest(QrGetComponentManager());
    setSearchPathUnderTest(other.c_str());
    QrGetComponentManager()->initialize(searchPathOf(folder.path()).c_str());
    EXPECT_EQ(namesOfProcess(), (Names{L"reentrant"}));
    setManagerUnderTest(nullptr);
}

/// Runs a copy of testHost in the folder as a separate process.
class HostProgram : public ManagerTest {
  protected:
    HostProgram() {
        manager.reset();
        std::filesystem::copy_file(
            buildFolder / "bin" / (std::wstring(L"testHost") + MZ_PROGRAM_EXTENSION), program());
        std::filesystem::create_directory(elsewhere());
    }

    std::filesystem::path program() const { return folder.path() / L"host" MZ_PROGRAM_EXTENSION; }
    std::filesystem::path elsewhere() const { return folder.path() / "elsewhere"; }

    ProgramResult run(const std::vector<std::string>& arguments) {
        return runProgram(program(), program().string(), arguments, elsewhere());
    }
};

TEST_F(HostProgram, WithANullPathSearchesItsOwnFolder) {
    add(L"goodWithKit");
    const ProgramResult result = run({});
    EXPECT_TRUE(result.finished);
    EXPECT_EQ(result.exitCode, 0);
    EXPECT_EQ(result.output, "made kit\ndone\n");
}

TEST_F(HostProgram, WithAPathOfSemicolonsSearchesItsOwnFolder) {
    add(L"goodWithKit");
    EXPECT_EQ(run({";"}).output, "made kit\ndone\n");
    EXPECT_EQ(run({";;;"}).output, "made kit\ndone\n");
}

TEST_F(HostProgram, WithAPathSearchesThatAlone) {
    add(L"goodWithKit");
    std::filesystem::copy_file(builtComponent(L"countedDescription"), elsewhere() / "counted");
    EXPECT_EQ(run({elsewhere().string()}).output, "made counted\ndone\n");
}

TEST_F(HostProgram, StartedWithoutAFolderInItsNameSearchesTheCurrentOne) {
    add(L"goodWithKit");
    std::filesystem::copy_file(builtComponent(L"countedDescription"), elsewhere() / "counted");
    EXPECT_EQ(runProgram(program(), "host", {}, elsewhere()).output, "made counted\ndone\n");
}

TEST_F(HostProgram, StartedByARelativeNameSearchesTheFolderInIt) {
    add(L"goodWithKit");
    std::filesystem::copy_file(builtComponent(L"countedDescription"), elsewhere() / "counted");
    EXPECT_EQ(runProgram(program(), "elsewhere/host", {}, folder.path()).output,
              "made counted\ndone\n");
}

TEST_F(HostProgram, StartedFromTheRootSearchesTheRootAndNotTheCurrentFolder) {
    std::filesystem::copy_file(builtComponent(L"countedDescription"), elsewhere() / "counted");
    EXPECT_EQ(runProgram(program(), "/host", {}, elsewhere()).output, "done\n");
}

TEST_F(HostProgram, StartedFromAFolderWithBlanksSearchesIt) {
    const auto inner = folder.path() / "with blanks";
    std::filesystem::create_directory(inner);
    const auto copy = inner / program().filename();
    std::filesystem::copy_file(program(), copy);
    std::filesystem::copy_file(builtComponent(L"goodByHand"), inner / "good");
    EXPECT_EQ(runProgram(copy, copy.string(), {}, elsewhere()).output,
              "made Name\nmade name\nmade third\ndone\n");
}

TEST_F(HostProgram, GetsTheSameAnswersInTheDestructorOfAStaticObject) {
    add(L"goodWithKit", L"zz" MZ_LIBRARY_EXTENSION);
    add(L"asksInDestructor");
    const ProgramResult result = run({"--again-at-end"});
    EXPECT_TRUE(result.finished);
    EXPECT_EQ(result.exitCode, 0);
    const std::string builders = "made asks\nmade counted\nmade kit\n";
    EXPECT_EQ(result.output, builders + "done\n" + builders);
}

TEST_F(HostProgram, EndsWellThoughALibraryInitialisesTheManagerAtTheEnd) {
    // The library in the child does not call the manager: the child sets none. The test is about
    // the order in which the process ends.
    add(L"initializesAtEnd");
    add(L"goodByHand");
    const ProgramResult result = run({});
    EXPECT_TRUE(result.finished);
    EXPECT_EQ(result.exitCode, 0);
    EXPECT_EQ(result.output, "made Name\nmade name\nmade third\nmade at end\ndone\n");
}

} // namespace
