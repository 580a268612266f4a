// SPDX-License-Identifier: BSL-1.0
#include "components/componentTools/uidText.h"
#include "tests/tools/toolsFixture.h"

using namespace Mz;
using namespace Mz::Tools;
using namespace Mz::Test;
using ::testing::Contains;
using ::testing::Field;
using ::testing::HasSubstr;
using ::testing::IsEmpty;

namespace {

class Explain : public ToolsTest {
  protected:
    static Verdict verdictOn(const std::filesystem::path& file) {
        return explainFile(file).verdict.verdict;
    }

    static Explanation loaded(const std::filesystem::path& file) {
        ExplainOptions options;
        options.load = true;
        options.probe = patient();
        return explainFile(file, options);
    }

    Finding loadedVerdict(const std::wstring& component) { return loaded(add(component)).verdict; }
};

TEST_F(Explain, EveryVerdictHasANameOfItsOwnAndASentence) {
    std::vector<std::string> names;
    for (int number = 0; number <= static_cast<int>(Verdict::uidTwice); ++number) {
        const auto verdict = static_cast<Verdict>(number);
        names.push_back(nameOf(verdict));
        EXPECT_EQ(verdictNamed(nameOf(verdict)), verdict);
        EXPECT_FALSE(sentenceOf({verdict, L"a", L"b"}).empty());
    }
    std::sort(names.begin(), names.end());
    EXPECT_EQ(std::unique(names.begin(), names.end()), names.end());
    EXPECT_FALSE(verdictNamed("nonsense"));
}

TEST_F(Explain, TellsAComponentFromTheOutside) {
    EXPECT_EQ(verdictOn(add(L"goodByHand")), Verdict::component);
    EXPECT_EQ(verdictOn(add(L"goodWithKit", "no-extension")), Verdict::component);
}

TEST_F(Explain, TellsWhyAFileIsNoCandidate) {
    EXPECT_EQ(verdictOn(folder.path() / "nothing"), Verdict::missing);
    EXPECT_EQ(verdictOn(folder.path()), Verdict::directory);
    EXPECT_EQ(verdictOn(hide(add(L"goodByHand"))), Verdict::hidden);
}

TEST_F(Explain, TellsWhatIsNoLibraryOfThisSystemAndProcessor) {
    EXPECT_EQ(verdictOn(folder.write("text.so", "some text")), Verdict::notALibrary);
    EXPECT_EQ(verdictOn(folder.write("empty", "")), Verdict::notALibrary);
    EXPECT_EQ(verdictOn(folder.write("short", "MZ")), Verdict::notALibrary);
    EXPECT_EQ(verdictOn(folder.write("other",
                                     forOtherProcessor(contentOf(builtComponent(L"goodByHand"))))),
              Verdict::otherProcessor);
    EXPECT_EQ(
        verdictOn(buildFolder / "bin" / (std::wstring(L"recordedHost") + MZ_PROGRAM_EXTENSION)),
        Verdict::program);
}

TEST_F(Explain, TellsALibraryWithoutTheEntryPointOrWithAnotherThingOfThatName) {
    EXPECT_EQ(verdictOn(add(L"noEntryPoint")), Verdict::noEntryPoint);
    EXPECT_EQ(verdictOn(add(L"dataEntryPoint")), Verdict::entryPointNoFunction);
    EXPECT_EQ(verdictOn(add(L"entryPointInDependency")), Verdict::noEntryPoint);
}

TEST_F(Explain, TellsALibraryThatWasBuiltForAnotherAbi) {
    for (const wchar_t* name :
         {L"stampedOtherVersion", L"stampedOtherCxxAbi", L"stampedOtherStrings",
          L"stampedOtherDebug", L"stampedOtherWideChar", L"kitOldStrings", L"kitDebugContainers"}) {
        const Explanation explanation = loaded(add(name));
        EXPECT_EQ(explanation.verdict.verdict, Verdict::otherAbi) << nameOf(verdictOn(add(name)));
        EXPECT_EQ(explanation.verdict, explainFile(add(name)).verdict);
        EXPECT_THAT(sentenceOf(explanation.verdict), HasSubstr(explanation.verdict.subject));
        EXPECT_THAT(sentenceOf(explanation.verdict), HasSubstr(explanation.verdict.words));
        EXPECT_THAT(explanation.builders, IsEmpty()) << "it is not loaded";
        EXPECT_THAT(explanation.dependencies, Not(IsEmpty()));
    }
    EXPECT_EQ(explainFile(add(L"kitOldStrings")).verdict.subject,
              L"libstdc++ with _GLIBCXX_USE_CXX11_ABI=0");
    EXPECT_EQ(explainFile(add(L"kitDebugContainers")).verdict.subject,
              L"containers in debug mode (_GLIBCXX_DEBUG)");
}

TEST_F(Explain, TellsALibraryWithAnotherInterfaceThanItsHost) {
    const std::filesystem::path file = add(L"changedInterface");
    EXPECT_EQ(loaded(file).verdict.verdict, Verdict::works);
    ExplainOptions options;
    options.load = true;
    options.hosts = {hostWithInterfaces()};
    const Explanation explanation = explainFile(file, options);
    EXPECT_EQ(explanation.verdict.verdict, Verdict::otherInterface);
    EXPECT_EQ(explanation.verdict.subject, L"Greeter");
    EXPECT_THAT(sentenceOf(explanation.verdict), HasSubstr(L"`void added()` here"));
    EXPECT_THAT(explanation.builders, IsEmpty()) << "it is not loaded";
    options.hosts = {file};
    EXPECT_EQ(explainFile(file, options).verdict.verdict, Verdict::works);
}

TEST_F(Explain, FindsTheStampInALibraryThatWasOptimisedAndStripped) {
    if (!std::filesystem::exists(builtComponent(L"kitShrunk")))
        GTEST_SKIP() << "it is built by GCC without sanitizers only";
    EXPECT_EQ(verdictOn(add(L"kitShrunk")), Verdict::otherAbi);
}

TEST_F(Explain, JudgesALibraryWithAFittingStampOrWithoutOneByLoadingIt) {
    for (const wchar_t* name : {L"goodWithKit", L"stamped", L"stampedNewer", L"stampedOtherLayout",
                                L"stampedNoMagic", L"goodByHand"})
        EXPECT_EQ(loadedVerdict(name).verdict, Verdict::works) << std::filesystem::path(name);
}

TEST_F(Explain, TellsALibraryThatWasCutOff) {
    const std::string content = contentOf(builtComponent(L"goodByHand"));
    EXPECT_EQ(verdictOn(folder.write("cut", content.substr(0, content.size() / 2))),
              Verdict::damaged);
}

TEST_F(Explain, NamesTheDependencyThatIsMissingAndTheCure) {
    const Explanation explanation = explainFile(add(L"missesDependency"));
    EXPECT_EQ(explanation.verdict.verdict, Verdict::dependencyMissing);
    EXPECT_EQ(explanation.verdict.subject,
              std::wstring(L"absentDependency") + MZ_LIBRARY_EXTENSION);
    EXPECT_THAT(sentenceOf(explanation.verdict), HasSubstr(L"absentDependency"));
    EXPECT_THAT(cureOf(explanation.verdict), HasSubstr(L"absentDependency"));
    EXPECT_THAT(explanation.dependencies, Contains(Field(&Dependency::found, false)).Times(1));
    EXPECT_THAT(explanation.dependencies, Contains(Field(&Dependency::found, true)));
}

TEST_F(Explain, NamesTheLibraryThroughWhichADependencyIsMissing) {
    // The dependency is there, and needs in turn what is not.
    const Explanation explanation = explainFile(add(L"goodByHand"));
    EXPECT_THAT(explanation.dependencies, Not(Contains(Field(&Dependency::found, false))));
    bool indirect = false;
    for (const Dependency& dependency : explanation.dependencies)
        indirect = indirect || dependency.neededBy != explanation.file.wstring();
    EXPECT_TRUE(indirect);
}

TEST_F(Explain, NamesWhatALibraryNeedsFromTheProgramOfItsHost) {
    const Finding finding = loadedVerdict(L"takesFromHost");
    EXPECT_EQ(finding.verdict, Verdict::needsHost);
    // One system's libraries name the program, the other's only the symbol.
    const std::wstring program = std::wstring(L"recordedHost") + MZ_PROGRAM_EXTENSION;
    EXPECT_EQ(finding.subject, program == L"recordedHost" ? L"mzTestHostNumber" : program);
    EXPECT_THAT(sentenceOf(finding), HasSubstr(L"from the program of its host"));
    EXPECT_THAT(cureOf(finding), HasSubstr(L"let the host load"));
}

TEST_F(Explain, RunsNothingOfTheFileUnlessTold) {
    forgetNotes();
    explainFile(add(L"goodByHand"));
    EXPECT_FALSE(isMapped(folder.path() / (std::wstring(L"goodByHand") + MZ_LIBRARY_EXTENSION)));
    EXPECT_EQ(verdictOn(add(L"crashesInInitialiser")), Verdict::component);
}

TEST_F(Explain, LoadsASoundLibraryInAProcessOfItsOwn) {
    const std::filesystem::path file = add(L"goodByHand");
    const Explanation explanation = loaded(file);
    EXPECT_EQ(explanation.verdict, (Finding{Verdict::works, L"3", {}}));
    EXPECT_EQ(explanation.label, L"Plain label");
    EXPECT_EQ(explanation.text, L"Plain text");
    ASSERT_EQ(explanation.builders.size(), 3u);
    EXPECT_EQ(explanation.builders[0].uid, goodUid);
    EXPECT_EQ(explanation.builders[0].number, 4000000000u);
    EXPECT_TRUE(explanation.builders[0].flag);
    EXPECT_EQ(explanation.builders[1].text, L"\u00E4\u4E2D");
    EXPECT_THAT(explanation.notes, IsEmpty());
    EXPECT_FALSE(isMapped(file));
}

TEST_F(Explain, IsNotConfusedByWhatALibraryPrints) {
    const Explanation explanation = loaded(add(L"chatters"));
    EXPECT_EQ(explanation.verdict.verdict, Verdict::works) << nameOf(explanation.verdict.verdict);
    EXPECT_EQ(explanation.builders.size(), 1u);
}

TEST_F(Explain, LoadsThousandsOfBuilders) {
    EXPECT_EQ(loaded(add(L"manyBuilders")).builders.size(), std::size_t{howMany});
}

TEST_F(Explain, TellsWhatIsWrongWithADescription) {
    EXPECT_EQ(loadedVerdict(L"nullDescription").verdict, Verdict::nullDescription);
    EXPECT_EQ(loadedVerdict(L"wrongInterface").verdict, Verdict::wrongInterface);
    EXPECT_EQ(loadedVerdict(L"offersNull"), (Finding{Verdict::wrongItem, L"null", {}}));
    EXPECT_EQ(loadedVerdict(L"offersWrongItem").verdict, Verdict::wrongItem);
    EXPECT_EQ(loadedVerdict(L"offersNothing").verdict, Verdict::offersNothing);
}

TEST_F(Explain, TellsWhatADescriptionThrowsAndWhere) {
    EXPECT_EQ(loadedVerdict(L"throwsInEntryPoint"),
              (Finding{Verdict::threw, L"its entry point", L"a value of type int"}));
    EXPECT_EQ(loadedVerdict(L"throwsInEnumerate").subject, L"enumerateBuilders");
    EXPECT_EQ(loadedVerdict(L"throwsInLabel").subject, L"its description");
    const Finding cast = loadedVerdict(L"castsInLabel"); // Not taken for a wrong item.
    EXPECT_EQ(cast.verdict, Verdict::threw);
    EXPECT_EQ(cast.subject, L"its description");
}

TEST_F(Explain, TellsOfAnExceptionThatLeavesTheInitialisers) {
    // One system's loader ends the process, the other's catches it and says that the load failed.
    const Finding finding = loadedVerdict(L"throwsInInitialiser");
    EXPECT_TRUE(finding.verdict == Verdict::aborted || finding.verdict == Verdict::loadFailed);
    EXPECT_THAT(sentenceOf(finding), HasSubstr(L"initialisers"));
    EXPECT_THAT(finding.words, HasSubstr(L"exception"));
}

TEST_F(Explain, TellsOfACrashAndWhere) {
    const Finding entryPoint = loadedVerdict(L"crashesInEntryPoint");
    EXPECT_EQ(entryPoint.verdict, Verdict::crashed);
    EXPECT_EQ(entryPoint.subject, L"its entry point");
    EXPECT_THAT(entryPoint.words, HasSubstr(L"memory that is not there"));
    const Finding initialiser = loadedVerdict(L"crashesInInitialiser");
    EXPECT_EQ(initialiser.verdict, Verdict::crashed) << nameOf(initialiser.verdict);
    EXPECT_EQ(initialiser.subject, L"its initialisers");
    EXPECT_EQ(loadedVerdict(L"crashesInEnumerate"),
              (Finding{Verdict::crashed, L"enumerateBuilders", entryPoint.words}));
}

TEST_F(Explain, TellsOfALibraryThatEndsTheProcess) {
    EXPECT_EQ(loadedVerdict(L"exits"), (Finding{Verdict::exited, L"enumerateBuilders", L"0"}));
    EXPECT_EQ(loadedVerdict(L"aborts"), (Finding{Verdict::aborted, L"enumerateBuilders", {}}));
}

TEST_F(Explain, TellsOfALibraryThatHangs) {
    ExplainOptions options;
    options.load = true;
    // However slow the machine, it does not come to an end.
    options.probe.timeLimit = std::chrono::milliseconds(5000);
    const Explanation explanation = explainFile(add(L"loopsForever"), options);
    EXPECT_EQ(explanation.verdict.verdict, Verdict::timedOut);
    EXPECT_EQ(explanation.verdict.words, L"5");
}

TEST_F(Explain, TellsOfALibraryThatEatsMemory) {
    ExplainOptions options;
    options.load = true;
    options.probe = patient();
    options.probe.memoryLimit = std::uint64_t{300} << 20;
    const Explanation explanation = explainFile(add(L"eatsMemory"), options);
    EXPECT_EQ(explanation.verdict.verdict, Verdict::outOfMemory);
    EXPECT_EQ(explanation.verdict.words, L"300");
    EXPECT_EQ(explainFile(add(L"offersForever"), options).verdict.verdict, Verdict::outOfMemory);
}

TEST_F(Explain, TellsOfALibraryThatOnlyClaimsToLackMemory) {
    EXPECT_EQ(loadedVerdict(L"throwsBadAlloc"),
              (Finding{Verdict::threw, L"enumerateBuilders", L"std::bad_alloc"}));
}

TEST_F(Explain, DoesNotCountTheMemoryOfTheHost) {
    ExplainOptions options;
    options.load = true;
    options.probe = patient();
    options.probe.memoryLimit = std::uint64_t{300} << 20;
    const std::string much(std::size_t{400} << 20, 'x');
    EXPECT_EQ(explainFile(add(L"goodByHand"), options).verdict.verdict, Verdict::works);
    EXPECT_EQ(explainFile(add(L"exits"), options).verdict.verdict, Verdict::exited);
    EXPECT_EQ(much.back(), 'x');
}

TEST_F(Explain, EndsTheProcessWhenTheUserWants) {
    ExplainOptions options;
    options.load = true;
    options.probe = patient();
    int asked = 0;
    options.probe.interrupted = [&asked] { return ++asked > 3; };
    EXPECT_EQ(explainFile(add(L"loopsForever"), options).verdict.verdict, Verdict::interrupted);
}

TEST_F(Explain, TellsOfAProbeThatIsNotThere) {
    ExplainOptions options;
    options.load = true;
    options.probe.program = folder.path() / "no-probe";
    const Explanation explanation = explainFile(add(L"goodByHand"), options);
    EXPECT_EQ(explanation.verdict.verdict, Verdict::probeFailed);
}

TEST_F(Explain, TellsOfAProgramThatIsNoProbe) {
    ExplainOptions options;
    options.load = true;
    options.probe = patient();
    options.probe.program =
        buildFolder / "bin" / (std::wstring(L"testHost") + MZ_PROGRAM_EXTENSION);
    EXPECT_EQ(explainFile(add(L"goodByHand"), options).verdict.verdict, Verdict::garbled);
}

TEST_F(Explain, NotesALibraryThatLiesAboutItsCountAndOneThatRepeatsItself) {
    EXPECT_THAT(loaded(add(L"liesAboutCountHuge")).notes,
                Contains(Finding{Verdict::miscounted, L"4000000000", L"40"}));
    EXPECT_THAT(loaded(add(L"duplicateUids")).notes,
                Contains(Field(&Finding::verdict, Verdict::uidTwice)).Times(1));
}

TEST_F(Explain, TellsWhatAListSaysOfTheFile) {
    const std::filesystem::path file = add(L"goodWithKit");
    ScanOptions scanning;
    scanning.folders = {folder.path()};
    scanning.probe = patient();
    RecordedLibraries list = scan(scanning).libraries;
    ASSERT_EQ(list.size(), 1u);
    ExplainOptions options;
    options.recorded = &list;
    EXPECT_EQ(explainFile(file, options).notes,
              (std::vector<Finding>{{Verdict::recordedUnchanged, L"1", {}}}));
    ++list[0].size;
    EXPECT_EQ(explainFile(file, options).notes[0],
              (Finding{Verdict::recordedChanged, L"size", {}}));
    ++list[0].time;
    EXPECT_EQ(explainFile(file, options).notes[0].subject, L"time and size");
    --list[0].size;
    EXPECT_EQ(explainFile(file, options).notes[0].subject, L"time");
    --list[0].time;
    list[0].builders.clear();
    EXPECT_EQ(explainFile(file, options).notes[0].verdict, Verdict::recordedFailed);
    list.clear();
    EXPECT_EQ(explainFile(file, options).notes[0].verdict, Verdict::notRecorded);
}

TEST_F(Explain, TellsWhoElseHasAnIdentifierAndWhoWins) {
    const std::filesystem::path first = add(L"sharesUidFirst"), second = add(L"sharesUidSecond");
    ScanOptions scanning;
    scanning.folders = {folder.path()};
    scanning.probe = patient();
    const RecordedLibraries list = scan(scanning).libraries;
    ExplainOptions options;
    options.recorded = &list;
    options.load = true;
    options.probe = patient();
    const auto noteOf = [&](const std::filesystem::path& file) {
        const Explanation explanation = explainFile(file, options);
        return explanation.notes.back();
    };
    EXPECT_EQ(noteOf(first).verdict, Verdict::uidTaken);
    EXPECT_EQ(noteOf(first).subject, textOf(sharedUid));
    EXPECT_THAT(noteOf(first).words, HasSubstr(L"sharesuidsecond"));
    EXPECT_EQ(noteOf(second).verdict, Verdict::uidWins);
}

} // namespace
