// SPDX-License-Identifier: BSL-1.0
/// Each rule with a library that breaks it and nothing else, and what is said of the rules.
#include "tests/checks/checking.h"

#include <algorithm>
#include <set>
#if !MZ_COUNTS_MEMORY
#include <sanitizer/lsan_interface.h>
#endif

using namespace Mz;
using namespace Mz::Tools;
using namespace Mz::Test;
using ::testing::ElementsAre;
using ::testing::HasSubstr;
using ::testing::IsEmpty;

namespace {

/// A library, and the rule that it breaks.
struct Broken {
    const wchar_t* component;
    const wchar_t* folder; ///< of the library; empty for one of its own name
    const char* rule;
};

void PrintTo(const Broken& broken, std::ostream* out) {
    *out << toUtf8(broken.component);
}

class BrokenLibrary : public ::testing::TestWithParam<Broken> {};

TEST_P(BrokenLibrary, IsFoundByItsRuleAlone) {
    const Broken& broken = GetParam();
    const std::string rule = broken.rule;
    if (!countsMemory && (rule == "object-growth" || rule == "persistant-frees" ||
                          rule == "library-reloads" || rule == "surroundings-memory"))
        GTEST_SKIP() << "the sanitizers have a heap of their own";
    CheckOptions checked = options(broken.component == std::wstring(L"hangsOnEmpty") ? 5 : 30);
    checked.threadSafe = rule == "surroundings-threads";
    const CheckResult result =
        checkLibrary(builtComponent(broken.component, broken.folder), checked);
    ASSERT_THAT(rulesOf(result), ElementsAre(broken.rule)) << textOf(result);
    for (const CheckFinding& finding : result.findings) {
        EXPECT_GT(finding.sentence.size(), 20u);
        EXPECT_EQ(finding.sentence.back(), L'.') << toUtf8(finding.sentence);
        EXPECT_THAT(finding.reproduce, ::testing::StartsWith(broken.rule));
    }
}

const Broken brokenLibraries[] = {
    {L"throwsInEnumerate", L"", "description-answers"},
    {L"nullDescription", L"", "description-answers"},
    {L"wrongInterface", L"", "description-answers"},
    {L"offersNull", L"", "description-answers"},
    {L"crashesInEntryPoint", L"", "description-answers"},
    {L"exits", L"", "description-answers"},
    {L"aborts", L"", "description-answers"},
    {L"throwsInCount", L"", "description-answers"},
    {L"throwsInFirstRelease", L"", "description-counted"},
    {L"staticCounted", L"checks", "description-counted"},
    {L"leaksDescription", L"checks", "description-counted"},
    {L"changesLabel", L"checks", "description-stable"},
    {L"ignoresStop", L"checks", "description-enumerates"},
    {L"liesAboutCountLow", L"", "description-count"},
    {L"nullTexts", L"", "description-texts"},
    {L"unlabelled", L"checks", "description-label"},
    {L"nilUid", L"", "uid-not-nil"},
    {L"duplicateUids", L"", "uid-unique"},
    {L"createsNull", L"", "builder-made"},
    {L"createsWrongObject", L"", "builder-made"},
    {L"otherBuilder", L"checks", "builder-interfaces"},
    {L"plainImport", L"checks", "builder-interfaces"},
    {L"leaksBuilder", L"checks", "builder-itself"},
    {L"hidesInterface", L"checks", "interfaces-agree"},
    {L"twoPrincipals", L"checks", "castable-consistent"},
    {L"countsTwice", L"checks", "references-balanced"},
    {L"leaksObject", L"checks", "object-destroyed"},
    {L"leaksMemory", L"checks", "object-growth"},
    {L"throwsInObject", L"checks", "exceptions-allowed"},
    {L"throwsInCreate", L"", "exceptions-allowed"},
    {L"unknownClass", L"checks", "persistant-class"},
    {L"cannotBeWritten", L"checks", "persistant-roundtrip"},
    {L"forgetsState", L"checks", "persistant-roundtrip"},
    {L"acceptsCutData", L"checks", "persistant-truncated"},
    {L"leaksOnFailure", L"checks", "persistant-frees"},
    {L"trustsCount", L"checks", "persistant-damaged"},
    {L"seeks", L"checks", "persistant-pieces"},
    {L"dotInExtension", L"checks", "extension-form"},
    {L"capitalExtension", L"checks", "extension-case"},
    {L"unlabelledImport", L"checks", "import-label"},
    {L"crashesOnForeign", L"checks", "canimport-survives"},
    {L"hangsOnEmpty", L"checks", "canimport-survives"},
    {L"changesController", L"checks", "canimport-restores"},
    {L"crashesInImport", L"checks", "import-survives"},
    {L"keepsInput", L"checks", "import-releases"},
    {L"silentImport", L"checks", "import-reports"},
    {L"percentProgress", L"checks", "import-progress"},
    {L"neverStops", L"checks", "import-stops"},
    {L"noEntryPoint", L"", "library-is-component"},
    {L"missesDependency", L"", "library-is-component"},
    {L"crashesInInitialiser", L"", "library-loads"},
    {L"staysLoaded", L"checks", "library-unloads"},
    {L"leaksAtLoad", L"checks", "library-reloads"},
    {L"leaksAtLaterLoads", L"checks", "library-reloads"},
    {L"leavesFile", L"checks", "library-leaves"},
    {L"leavesThread", L"checks", "library-leaves"},
    {L"exportsMore", L"checks", "library-exports"},
    {L"takesFromHost", L"", "library-host"},
    {L"localeNumbers", L"checks", "surroundings-locale"},
    {L"groupsDigits", L"checks", "surroundings-locale"},
    {L"asksFolder", L"checks", "surroundings-folder"},
    {L"needsInput", L"checks", "surroundings-input"},
    {L"uninitialised", L"checks", "surroundings-memory"},
    {L"notThreadSafe", L"checks", "surroundings-threads"},
    {L"anyUid", L"checks", "uid-exact"},
    {L"failsOwnTest", L"checks", "own-tests"},
};

INSTANTIATE_TEST_SUITE_P(Check, BrokenLibrary, ::testing::ValuesIn(brokenLibraries),
                         [](const auto& test) { return toUtf8(test.param.component); });

TEST(CheckedLibraries, ThatEndTheProcessForWantOfMemoryAreFoundWherePossible) {
    const CheckResult result = checkLibrary(builtComponent(L"terminates", L"checks"), options());
    if (limitsAllocations)
        EXPECT_THAT(rulesOf(result), ElementsAre("allocation-failure")) << textOf(result);
    else
        EXPECT_THAT(result.findings, IsEmpty()) << textOf(result);
}

TEST(CheckedLibraries, ThatShareAUidAreFoundTogether) {
    std::vector<CheckResult> results;
    for (const wchar_t* name : {L"sharesUidFirst", L"sharesUidSecond", L"goodWithKit"})
        results.push_back(checkLibrary(builtComponent(name), options()));
    for (const CheckResult& result : results)
        EXPECT_THAT(result.findings, IsEmpty()) << textOf(result);
    compareLibraries(results);
    EXPECT_THAT(rulesOf(results[0]), ElementsAre("uid-free")) << textOf(results[0]);
    EXPECT_THAT(rulesOf(results[1]), ElementsAre("uid-free"));
    EXPECT_THAT(results[2].findings, IsEmpty());
    EXPECT_THAT(toUtf8(results[0].findings[0].sentence), HasSubstr("sharesUidSecond"));
}

TEST(CheckedLibraries, ShareNoUidThatIsNil) {
    CheckResult nil, other;
    nil.builders = {{QrUid{}, L"nil"}, {{1, 2, 3, 4}, L"shared"}};
    other.builders = {{{1, 2, 3, 4}, L"taken"}, {QrUid{}, L"nil, too"}};
    std::vector<CheckResult> results{nil, other};
    compareLibraries(results);
    ASSERT_EQ(results[0].findings.size(), 1u) << textOf(results[0]);
    EXPECT_THAT(toUtf8(results[0].findings[0].place), HasSubstr("\"shared\""));
    ASSERT_EQ(results[1].findings.size(), 1u) << textOf(results[1]);
    EXPECT_THAT(toUtf8(results[1].findings[0].place), HasSubstr("\"taken\""));
}

TEST(CheckedLibraries, WithThousandsOfBuildersAreChecked) {
    CheckOptions one = options(60);
    one.reproduce = "builder-made";
    const CheckResult result = checkLibrary(builtComponent(L"manyBuilders"), one);
    EXPECT_THAT(result.findings, IsEmpty()) << textOf(result);
    EXPECT_EQ(result.builders.size(), 5000u);
}

TEST(CheckFindings, AreRepeatedByTheirValue) {
    const auto library = builtComponent(L"crashesInImport", L"checks");
    const CheckResult first = checkLibrary(library, options());
    ASSERT_EQ(first.findings.size(), 1u) << textOf(first);
    const CheckFinding& found = first.findings[0];
    EXPECT_THAT(toUtf8(found.sentence), HasSubstr("64 bytes 0xFF"));
    CheckOptions again = options();
    again.reproduce = found.reproduce;
    const CheckResult second = checkLibrary(library, again);
    ASSERT_EQ(second.findings.size(), 1u) << textOf(second);
    EXPECT_EQ(second.findings[0].sentence, found.sentence);
    EXPECT_EQ(second.findings[0].reproduce, found.reproduce);
    again.reproduce = "import-survives:0:0:1";
    EXPECT_THAT(checkLibrary(library, again).findings, IsEmpty());
}

TEST(CheckFindings, OfOneRuleAreFoundAlone) {
    CheckOptions one = options();
    one.reproduce = "extension-form";
    const CheckResult result = checkLibrary(builtComponent(L"dotInExtension", L"checks"), one);
    EXPECT_THAT(rulesOf(result), ElementsAre("extension-form"));
    one.reproduce = "extension-case";
    EXPECT_THAT(checkLibrary(builtComponent(L"dotInExtension", L"checks"), one).findings,
                IsEmpty());
    EXPECT_THAT(rulesOf(checkLibrary(builtComponent(L"nullDescription"), one)),
                ElementsAre("description-answers"))
        << "nothing can be checked then";
    for (const char* wrong :
         {"no-such-rule", "import-survives:1", "import-survives:x:0:1", "import-survives:0x:0:1",
          "import-survives:0:-2:1", "import-survives:0:0:x"}) {
        one.reproduce = wrong;
        EXPECT_THROW(checkLibrary(builtComponent(L"goodWithKit"), one), std::invalid_argument);
    }
}

#if MZ_COUNTS_MEMORY
struct KeptReferences {};
#else
/// A check does not release what a library made, because a faulty `release` would end the process.
/// In this process the leak checker sees it.
using KeptReferences = __lsan::ScopedDisabler;
#endif

TEST(CheckFindings, AreTheSameInThisProcess) {
    [[maybe_unused]] const KeptReferences kept;
    CheckOptions here = options();
    here.inProcess = true;
    const CheckResult result = checkLibrary(builtComponent(L"percentProgress", L"checks"), here);
    EXPECT_THAT(rulesOf(result), ElementsAre("import-progress")) << textOf(result);
    EXPECT_THAT(result.notRun, ::testing::Not(IsEmpty()));
}

TEST(CheckFindings, OfSamplesNeedTheSamples) {
    CheckOptions sampled = options();
    const std::filesystem::path samples =
        std::filesystem::path(MZ_SOURCE_PATH) / "examples" / "mesh" / "samples";
    for (const char* name :
         {"icosahedron.obj", "icosahedron.off", "icosahedronLittle.ply", "icosahedronBinary.stl"})
        sampled.samples.push_back(samples / name);
    for (const wchar_t* name : {L"meshObj", L"meshOff", L"meshPly", L"meshStl", L"meshScene"}) {
        const CheckResult result = checkLibrary(builtComponent(name, L"mesh"), sampled);
        EXPECT_THAT(result.findings, IsEmpty()) << textOf(result);
    }
}

TEST(CheckRules, HaveStableNamesAndWholeTexts) {
    std::set<std::string> ids;
    for (const CheckRule* rule : checkRules()) {
        EXPECT_TRUE(ids.insert(rule->id).second) << rule->id;
        EXPECT_EQ(std::string(rule->id).find_first_not_of("abcdefghijklmnopqrstuvwxyz-"),
                  std::string::npos)
            << rule->id;
        for (const std::wstring text : {rule->title, rule->explanation}) {
            EXPECT_EQ(text.back(), L'.') << rule->id;
            EXPECT_EQ(text.find(L"  "), std::wstring::npos) << rule->id;
        }
        EXPECT_EQ(findCheckRule(rule->id), rule);
    }
    EXPECT_EQ(findCheckRule("no-such-rule"), nullptr);
}

TEST(CheckRules, AreEachBrokenByALibraryOfTheTests) {
    std::set<std::string> broken{"uid-free", "allocation-failure"};
    for (const Broken& library : brokenLibraries)
        broken.insert(library.rule);
    for (const CheckRule* rule : checkRules())
        EXPECT_EQ(broken.count(rule->id), 1u) << rule->id;
}

TEST(CheckRules, StandInTheDocumentation) {
    const std::string page = contentOf(std::filesystem::path(MZ_SOURCE_PATH) / "docs/checks.md");
    for (const CheckRule* rule : checkRules()) {
        const std::string heading =
            "### `" + std::string(rule->id) + "` (" + nameOf(rule->grade) + ")\n";
        const std::size_t at = page.find(heading);
        ASSERT_NE(at, std::string::npos) << heading;
        std::string section = page.substr(at + heading.size());
        section.resize(std::min(section.find("\n#"), section.size()));
        std::string joined;
        for (const char character : section)
            joined += character == '\n' ? ' ' : character;
        EXPECT_THAT(joined, HasSubstr(toUtf8(rule->title))) << rule->id;
        EXPECT_THAT(joined, HasSubstr(toUtf8(rule->explanation))) << rule->id;
    }
}

} // namespace
