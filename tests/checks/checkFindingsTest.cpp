// SPDX-License-Identifier: BSL-1.0
/// What exactly is found in libraries: the grade, the rule, the place and the sentence of each
/// finding.
#include "tests/checks/checking.h"

using namespace Mz;
using namespace Mz::Tools;
using namespace Mz::Test;
using ::testing::AllOf;
using ::testing::ElementsAre;
using ::testing::EndsWith;
using ::testing::HasSubstr;
using ::testing::IsEmpty;
using ::testing::StartsWith;

namespace {

/// Returns each finding as "GRADE RULE: PLACE: SENTENCE".
std::vector<std::string> linesOf(const CheckResult& result) {
    std::vector<std::string> lines;
    for (const CheckFinding& finding : result.findings)
        lines.push_back(std::string(nameOf(finding.rule->grade)) + " " + finding.rule->id + ": " +
                        toUtf8(finding.place) + ": " + toUtf8(finding.sentence));
    return lines;
}

CheckResult check(const wchar_t* component, const CheckOptions& checked = options()) {
    return checkLibrary(builtComponent(component, L"checks"), checked);
}

/// Returns the options for one rule, or for the value of a finding.
CheckOptions optionsFor(const char* reproduce) {
    CheckOptions checked = options();
    checked.reproduce = reproduce;
    return checked;
}

TEST(CheckFindsExactly, EachFaultOfManyBuilders) {
    CheckOptions checked = options();
    checked.threadSafe = true;
    const auto builder = [](const std::string& name, const std::string& word) {
        return "builder \"" + name + "\" (" + word + "-3C5A11EF-8D1B2C00-6F40A9D7): ";
    };
    const std::string unread = "error persistant-roundtrip: " + builder("unreadable", "00005E16") +
                               "read does not accept what write wrote in ";
    const std::string reason = " form: the number is too old: Error reading stream. Read the "
                               "values that are written, in the same order.";
    EXPECT_THAT(
        linesOf(check(L"manyFaults", checked)),
        ElementsAre(
            "error interfaces-agree: " + builder("viewed", "00005E11") +
                "the object: the interface 81C8DF24-A78111D1-988A4445-53540000 does not know "
                "itself: its getInterface returns null. Answer for it in every view of the object.",
            "error references-balanced: " + builder("miscounting", "00005E12") +
                "the object: newReference and release do not return the number of references minus "
                "one. Use QrCastRef to count.",
            "error object-destroyed: " + builder("miscounting", "00005E12") +
                "the last release of an object returns 0 instead of -1. Let it destroy the object.",
            "error object-destroyed: " + builder("uncounted", "00005E13") +
                "createObject returns a new object at each call, but the objects do not count "
                "references, so that nothing destroys them. Use QrCastRef.",
            "error exceptions-allowed: " + builder("throwsClass", "00005E15") +
                "getClassUid throws an exception that hosts do not expect: no class today. Catch "
                "it, report it to the process controller and return null, or throw an exception of "
                "QrStreamEx.",
            "error persistant-class: " + builder("classless", "00005E14") +
                "getClassUid returns null. Return the uid of the builder that makes objects of "
                "this class.",
            unread + "binary" + reason, unread + "text" + reason,
            "error surroundings-threads: " + builder("oneThread", "00005E17") +
                "createObject fails when 8 threads call it at a time: another thread is here. "
                "Guard what the builder shares, or do not declare the library thread-safe."));
}

TEST(CheckFindsExactly, EachFaultOfManyImporters) {
    const auto builder = [](const std::string& name, const std::string& word) {
        return "builder \"" + name + "\" (" + word + "-3C5A11EF-8D1B2C00-6F40A9D7): ";
    };
    EXPECT_THAT(
        linesOf(check(L"manyImporters")),
        ElementsAre(
            "error extension-form: " + builder("nameless", "00005E20") +
                "an extension is null or empty. Enumerate what follows the dot of a file's name.",
            AllOf(StartsWith("error canimport-restores: " + builder("wandering", "00005E21") +
                             "canImport changes the settings of the process (folder "),
                  HasSubstr(" to folder "),
                  EndsWith("), with input 0 (empty). Only read from the input.")),
            "error import-stops: " + builder("warning", "00005E22") +
                "import was told to stop, and asked 9 times more until it was complete, for input "
                "0 (empty). Return null when isInterrupted returns true, or progress or warning "
                "returns false."));
}

TEST(CheckFindsExactly, FaultsOfDescriptions) {
    EXPECT_THAT(linesOf(check(L"neverFinishes")),
                ElementsAre("error description-enumerates: : enumerateBuilders does not end with "
                            "finished. Call it once after the last element and return its result.",
                            "error builder-itself: builder \"broken\" (5E1D0001-3C5A11EF-8D1B2C00-"
                            "6F40A9D7): getBuilder returns null. Return the builder to use."));
    EXPECT_THAT(
        linesOf(check(L"describesOnce")),
        ElementsAre("error description-counted: : the last release destroys the description, but "
                    "the entry point returns it again. Return an uncounted static object, or a new "
                    "one at each call."));
    EXPECT_THAT(linesOf(check(L"throwsLater")),
                ElementsAre("error description-counted: : the entry point throws: one host is "
                            "enough. Return a description at every call."));
    EXPECT_THAT(linesOf(check(L"throwsOnce")),
                ElementsAre("error description-counted: : the release of the description throws: "
                            "too many references. Let no release throw."));
}

TEST(CheckFindsExactly, WhichTestOfALibraryFails) {
    EXPECT_THAT(linesOf(check(L"failsOwnTest", optionsFor("own-tests"))),
                ElementsAre("error own-tests: test \"wrong\": one and one is not three.",
                            "error own-tests: test \"throws\": it throws: no room for one more.",
                            "error own-tests: test \"last\": it is the last one of all."));
}

TEST(CheckFindsExactly, WhatDependsOnTheSurroundings) {
    if (!countsMemory)
        GTEST_SKIP() << "the sanitizers have a heap of their own";
    const std::string end = "-3C5A11EF-8D1B2C00-6F40A9D7)";
    EXPECT_THAT(
        linesOf(check(L"differsAlways")),
        ElementsAre(AllOf(StartsWith("error surroundings-input: builder \"input\" (00005E31" + end +
                                     ": createObject crashes: "),
                          EndsWith(", without standard input. Do not use standard input.")),
                    "error surroundings-memory: : the answer differs from process to process: "
                    "write of createObject of the builder \"time\" (00005E30" +
                        end +
                        ", binary. Initialise every variable, and write no addresses, times or "
                        "random values."));
    const CheckResult ofInput = check(L"differsAlways", optionsFor("surroundings-input"));
    EXPECT_THAT(rulesOf(ofInput), ElementsAre("surroundings-input"))
        << "what differs from process to process is the finding of another rule";
    EXPECT_THAT(linesOf(check(L"needsInputToDescribe", optionsFor("surroundings-input"))),
                ElementsAre("error surroundings-input: : the answer changes without standard "
                            "input: createObject of the builder \"broken\" (5E1D0001" +
                            end + ". Do not use standard input."));
}

/// The heap gives blocks of equal size back, the last first. Without a pattern in them the library
/// would find the same part of a message in each process.
TEST(CheckFindsExactly, NumbersThatAMessageOfTheCheckLeft) {
    if (!countsMemory)
        GTEST_SKIP() << "the sanitizers have a heap of their own";
    EXPECT_THAT(linesOf(check(L"readsWhatWasLeft", optionsFor("surroundings-memory"))),
                ElementsAre("error surroundings-memory: : the answer changes in a process whose "
                            "memory contained something else: write of createObject of the builder "
                            "\"broken\" (5E1D0001-3C5A11EF-8D1B2C00-6F40A9D7), binary. Initialise "
                            "every variable, and write no addresses."));
}

TEST(CheckFindsExactly, WhyALibraryIsNotLoaded) {
    EXPECT_THAT(linesOf(check(L"refusesToLoad")),
                ElementsAre(AllOf(StartsWith("error library-loads: : it cannot be loaded: "),
                                  EndsWith(". The command `mzcomponents explain` tells more."))));
}

TEST(CheckFindsExactly, HowAProcessEnded) {
    constexpr const char* answers = "error description-answers: : enumerateBuilders ";
    constexpr const char* debugger = ". Repeat it in a debugger, with --in-process.";
    CheckOptions small = options();
    small.process.memoryLimit = std::uint64_t{200} << 20;
    EXPECT_THAT(linesOf(checkLibrary(builtComponent(L"eatsMemory"), small)),
                ElementsAre(std::string(answers) + "uses more than 200 MiB of memory" + debugger));
    for (const wchar_t* writes : {L"writesToPipes", L"writesForever"})
        EXPECT_THAT(
            linesOf(checkLibrary(builtComponent(writes), options())),
            ElementsAre(std::string(answers) + "writes into files that are not its own" + debugger))
            << toUtf8(writes);
}

TEST(CheckFindsExactly, AProcessThatTakesTooLong) {
    CheckOptions hasty = options();
    hasty.process.timeLimit = std::chrono::milliseconds(300);
    EXPECT_THAT(linesOf(checkLibrary(builtComponent(L"loopsForever"), hasty)),
                ElementsAre(EndsWith(" does not return within 1 second. Repeat it in a debugger, "
                                     "with --in-process.")));
}

TEST(CheckFindings, OfRandomInputComeAfterTheFixedInput) {
    CheckOptions checked = optionsFor("import-survives");
    EXPECT_THAT(check(L"importsOften", checked).findings, IsEmpty());
    checked.fuzzTime = std::chrono::seconds(1);
    const CheckResult result = check(L"importsOften", checked);
    EXPECT_THAT(linesOf(result),
                ElementsAre(AllOf(
                    StartsWith("error import-survives: builder \"broken\" (5E1D0001-3C5A11EF-"
                               "8D1B2C00-6F40A9D7): import ends the process, with status 7, with "
                               "input 99 ("),
                    EndsWith(", change 99). Repeat it in a debugger, with --in-process."))));
    EXPECT_EQ(result.findings.at(0).reproduce, "import-survives:0:99:1");
}

TEST(CheckFindings, OfUnexpectedExceptionsAreRepeated) {
    const CheckResult all = check(L"throwsInObject");
    ASSERT_THAT(rulesOf(all), ElementsAre("exceptions-allowed")) << textOf(all);
    const CheckResult again =
        check(L"throwsInObject", optionsFor(all.findings[0].reproduce.c_str()));
    EXPECT_EQ(linesOf(again), linesOf(all));
    // Other rules call the library then, and their findings are not wanted.
    EXPECT_THAT(check(L"dotInExtension", optionsFor("exceptions-allowed")).findings, IsEmpty());
}

TEST(CheckFindings, OfThreadsNeedABuilder) {
    CheckOptions checked = options();
    checked.threadSafe = true;
    const CheckResult result = checkLibrary(builtComponent(L"createsNull"), checked);
    EXPECT_THAT(rulesOf(result), ElementsAre("builder-made")) << textOf(result);
}

TEST(CheckFindings, NameNoRemedyIfThereIsNone) {
    const TemporaryDirectory folder;
    EXPECT_THAT(linesOf(checkLibrary(folder.write("text", "no library"), options())),
                ElementsAre("error library-is-component: : it is no library."));
}

TEST(CheckedLibraries, AreNotJudgedIfTheProcessCannotBeStarted) {
    CheckOptions checked = options();
    checked.process.program = buildFolder / "missing";
    try {
        check(L"soundImporter", checked);
        FAIL() << "a result without a process";
    } catch (const std::runtime_error& failure) {
        EXPECT_THAT(failure.what(), StartsWith("the process of the check could not be started: "));
    }
}

/// Each survey of the library is a process of its own.
TEST(CheckedLibraries, AreNotComparedIfTheUserInterrupts) {
    for (const int last : {3, 4}) {
        int started = 0;
        CheckOptions checked = optionsFor("surroundings-input");
        checked.process.interrupted = [&] {
            started += hasChildProcess() ? 0 : 1;
            return started > last - 1;
        };
        const CheckResult result = check(L"needsInputToDescribe", checked);
        EXPECT_TRUE(result.interrupted) << last;
        EXPECT_THAT(result.findings, IsEmpty()) << textOf(result);
    }
}

TEST(CheckedLibraries, AreNotJudgedIfTheUserInterrupts) {
    CheckOptions checked = options();
    checked.process.interrupted = [] { return true; };
    const CheckResult result = check(L"neverFinishes", checked);
    EXPECT_TRUE(result.interrupted);
    EXPECT_THAT(result.findings, IsEmpty()) << textOf(result);
}

} // namespace
