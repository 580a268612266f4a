// SPDX-License-Identifier: BSL-1.0
/// The command `check`, as people, scripts and build servers use it.
#include "components/componentTools/check.h"
#include "tests/tools/toolsFixture.h"

#include <algorithm>
#include <nlohmann/json.hpp>

using namespace Mz;
using namespace Mz::Test;
using ::testing::HasSubstr;
using ::testing::Not;
using Json = nlohmann::json;

namespace {

class CheckCommand : public ::testing::Test {
  protected:
    ProgramResult run(std::vector<std::string> arguments) const {
        arguments.insert(arguments.begin(), "check");
        return runCommandLine(arguments, work.path());
    }

    static std::string library(const wchar_t* name, const wchar_t* folder = L"checks") {
        return builtComponent(name, folder).string();
    }

    std::string write(const std::string& name, const std::string& content) const {
        std::ofstream(work.path() / name) << content;
        return name;
    }

    TemporaryDirectory work;
};

TEST_F(CheckCommand, EndsWithZeroForAGoodLibrary) {
    const ProgramResult result = run({library(L"goodWithKit", L"goodWithKit")});
    EXPECT_EQ(result.exitCode, 0) << result.output;
    EXPECT_EQ(result.output, "1 library: 0 errors, 0 warnings, 0 notes\n");
}

TEST(CheckedLibraries, AreNamedIfTheProcessEndsBeforeItsFirstRule) {
    Tools::CheckOptions options;
    options.process.program =
        buildFolder / "bin" / (std::wstring(L"mzcomponents") + MZ_PROGRAM_EXTENSION);
    const Tools::CheckResult result = Tools::checkLibrary(builtComponent(L"goodWithKit"), options);
    ASSERT_EQ(result.findings.size(), 1u);
    EXPECT_STREQ(result.findings[0].rule->id, "library-loads");
    EXPECT_EQ(result.findings[0].sentence, L"the library ends the process, with status 2. Repeat "
                                           L"it in a debugger, with --in-process.");
    EXPECT_FALSE(result.notRun.empty());
}

TEST_F(CheckCommand, TakesOneSampleForEachOption) {
    const std::string sample = write("sample.txt", "nothing");
    const ProgramResult result =
        run({"--sample", sample, "--sample", sample, library(L"goodWithKit", L"goodWithKit")});
    EXPECT_EQ(result.exitCode, 0) << result.output;
    EXPECT_EQ(result.output, "1 library: 0 errors, 0 warnings, 0 notes\n");
}

TEST_F(CheckCommand, NamesTheFileTheGradeThePlaceAndTheRule) {
    const ProgramResult result = run({library(L"dotInExtension")});
    EXPECT_EQ(result.exitCode, 1);
    EXPECT_THAT(result.output, HasSubstr("dotInExtension"));
    EXPECT_THAT(result.output, HasSubstr(": error: builder \"broken\" (5E1D0001-3C5A11EF-8D1B2C00-"
                                         "6F40A9D7): the extension \"*.broken\""));
    EXPECT_THAT(result.output, HasSubstr("[extension-form]\n"));
    EXPECT_THAT(result.output, HasSubstr("1 library: 1 error, 0 warnings, 0 notes\n"));
}

TEST_F(CheckCommand, PrintsTheCommandThatRepeatsACrash) {
    const ProgramResult result = run({library(L"crashesInImport")});
    EXPECT_EQ(result.exitCode, 1);
    const std::size_t at = result.output.find("--reproduce import-survives:0:");
    ASSERT_NE(at, std::string::npos) << result.output;
    const std::size_t begin = result.output.find("import-survives:", at);
    const std::string value =
        result.output.substr(begin, result.output.find_first_of("\r\n", begin) - begin);
    const ProgramResult again = run({library(L"crashesInImport"), "--reproduce", value});
    EXPECT_EQ(again.exitCode, 1);
    EXPECT_THAT(again.output, HasSubstr(value));
}

TEST_F(CheckCommand, FailsOnTheGradesThatItIsTold) {
    const std::string file = library(L"capitalExtension");
    EXPECT_EQ(run({file}).exitCode, 0);
    EXPECT_EQ(run({file, "--fail-on", "warning"}).exitCode, 1);
    EXPECT_EQ(run({file, "--fail-on", "note"}).exitCode, 1);
    EXPECT_EQ(run({file, "--fail-on", "nothing"}).exitCode, 2);
}

TEST_F(CheckCommand, FailsOnANoteOnlyIfItIsToldTo) {
    const std::string file = library(L"unlabelledImport");
    const ProgramResult result = run({file});
    EXPECT_EQ(result.exitCode, 0);
    EXPECT_THAT(result.output, HasSubstr(": note: builder \"broken\""));
    EXPECT_THAT(result.output, HasSubstr("[import-label]\n"));
    EXPECT_THAT(result.output, HasSubstr("1 library: 0 errors, 0 warnings, 1 note\n"));
    EXPECT_EQ(run({file, "--fail-on", "warning"}).exitCode, 0);
    EXPECT_EQ(run({file, "--fail-on", "note", "--sarif", "log"}).exitCode, 1);
    const Json found = Json::parse(contentOf(work.path() / "log"))["runs"][0]["results"][0];
    EXPECT_EQ(found["level"], "note");
}

TEST_F(CheckCommand, FindsTheBuilderOfAClassInAnotherLibrary) {
    const std::string stores = library(L"storesCrates", L"sound");
    const ProgramResult alone = run({stores});
    EXPECT_EQ(alone.exitCode, 1);
    EXPECT_THAT(alone.output, HasSubstr("[persistant-class]\n"));
    const ProgramResult both = run({stores, library(L"crates", L"sound")});
    EXPECT_EQ(both.exitCode, 0) << both.output;
    EXPECT_EQ(both.output, "2 libraries: 0 errors, 0 warnings, 0 notes\n");
}

TEST_F(CheckCommand, ToleratesWhatIsSuppressedWithAReason) {
    const std::string file = library(L"dotInExtension");
    const std::string name = std::filesystem::path(file).filename().string();
    write("good", "# Known.\n\nextension-form " + name + " The old host wants it.\n");
    const ProgramResult result = run({file, "--suppress", "good"});
    EXPECT_EQ(result.exitCode, 0) << result.output;
    EXPECT_THAT(result.output, HasSubstr("0 errors, 0 warnings, 0 notes; 1 suppressed"));
    write("any", "extension-form * The old host wants it.\n");
    EXPECT_EQ(run({file, "--suppress", "any"}).exitCode, 0);
    write("other", "extension-form other.so The old host wants it.\n");
    EXPECT_EQ(run({file, "--suppress", "other"}).exitCode, 1);
    write("noReason", "extension-form " + name + "\n");
    EXPECT_EQ(run({file, "--suppress", "noReason"}).exitCode, 2);
    write("noRule", "extension-shape * A reason.\n");
    EXPECT_EQ(run({file, "--suppress", "noRule"}).exitCode, 2);
    EXPECT_EQ(run({file, "--suppress", "missing"}).exitCode, 2);
}

TEST_F(CheckCommand, WritesJson) {
    write("good", "extension-form * The old host wants it.\n");
    const ProgramResult result = run({library(L"dotInExtension"), "--json", "--suppress", "good"});
    const Json one = Json::parse(result.output).at("libraries").at(0);
    EXPECT_THAT(one.at("file").get<std::string>(), HasSubstr("dotInExtension"));
    const Json finding = one.at("findings").at(0);
    EXPECT_EQ(finding.at("rule"), "extension-form");
    EXPECT_EQ(finding.at("grade"), "error");
    EXPECT_EQ(finding.at("suppressed"), "The old host wants it.");
    EXPECT_EQ(one.at("builders").at(0).at("name"), "broken");
}

TEST_F(CheckCommand, WritesSarif) {
    EXPECT_EQ(run({library(L"dotInExtension"), "--sarif", "log"}).exitCode, 1);
    const Json log = Json::parse(contentOf(work.path() / "log"));
    EXPECT_EQ(log.at("version"), "2.1.0");
    const Json result = log.at("runs").at(0).at("results").at(0);
    EXPECT_EQ(result.at("ruleId"), "extension-form");
    EXPECT_EQ(result.at("level"), "error");
    EXPECT_THAT(result.at("locations")
                    .at(0)
                    .at("physicalLocation")
                    .at("artifactLocation")
                    .at("uri")
                    .get<std::string>(),
                HasSubstr("dotInExtension"));
    EXPECT_GT(log.at("runs").at(0).at("tool").at("driver").at("rules").size(), 30u);
}

TEST_F(CheckCommand, WritesJUnitWithEscapedTexts) {
    EXPECT_EQ(run({library(L"dotInExtension"), "--junit", "report"}).exitCode, 1);
    const std::string report = contentOf(work.path() / "report");
    EXPECT_THAT(report, HasSubstr("name=\"extension-form\"><failure message="));
    EXPECT_THAT(report, HasSubstr("the extension &quot;*.broken&quot;"));
    EXPECT_THAT(report, HasSubstr("failures=\"1\""));
    EXPECT_THAT(report, Not(HasSubstr("\"*.broken\"")));
    // A warning does not fail, but is in the output of its case.
    EXPECT_EQ(run({library(L"capitalExtension"), "--junit", "report"}).exitCode, 0);
    const std::string warned = contentOf(work.path() / "report");
    EXPECT_THAT(warned, HasSubstr("name=\"extension-case\"><system-out>"));
    EXPECT_THAT(warned, HasSubstr("failures=\"0\""));
}

TEST_F(CheckCommand, ExplainsRulesWithoutALibrary) {
    const ProgramResult one = run({"--explain", "extension-form"});
    EXPECT_EQ(one.exitCode, 0);
    EXPECT_THAT(one.output, HasSubstr("extension-form (error, import builders)\n"));
    EXPECT_THAT(one.output, HasSubstr("no wildcard"));
    EXPECT_THAT(run({"--explain", "import-label"}).output,
                HasSubstr("import-label (note, import builders)\n"));
    const ProgramResult all = run({"--explain", "all"});
    EXPECT_GT(std::count(all.output.begin(), all.output.end(), '\n'), 30);
    EXPECT_EQ(run({"--explain", "no-such-rule"}).exitCode, 2);
    EXPECT_EQ(run({}).exitCode, 2);
}

TEST_F(CheckCommand, ChecksAWholeFolderAndComparesItsLibraries) {
    TemporaryDirectory folder;
    for (const wchar_t* name : {L"sharesUidFirst", L"sharesUidSecond", L"noEntryPoint"})
        std::filesystem::copy_file(builtComponent(name),
                                   folder.path() / builtComponent(name).filename());
    folder.write("text", "no library");
    const ProgramResult result = run({"--path", folder.path().string(), "--jobs", "2"});
    EXPECT_EQ(result.exitCode, 1);
    EXPECT_THAT(result.output, HasSubstr("[uid-free]"));
    EXPECT_THAT(result.output, HasSubstr("2 libraries: 2 errors, 0 warnings, 0 notes\n"));
    EXPECT_EQ(run({"--path", (folder.path() / "missing").string()}).exitCode, 1);
}

TEST_F(CheckCommand, FindsMoreWithRandomInput) {
    const std::string file = library(L"trustsLateByte");
    EXPECT_EQ(run({file}).exitCode, 0);
    const ProgramResult fuzzed = run({file, "--fuzz", "20", "--reproduce", "import-survives"});
    EXPECT_EQ(fuzzed.exitCode, 1) << fuzzed.output;
    EXPECT_THAT(fuzzed.output, HasSubstr("--reproduce import-survives:0:"));
}

TEST_F(CheckCommand, ReportsAFileThatIsMissing) {
    const ProgramResult result = run({"missing.so"});
    EXPECT_EQ(result.exitCode, 1);
    EXPECT_THAT(result.output, HasSubstr("[library-is-component]"));
    EXPECT_EQ(run({library(L"goodWithKit", L"goodWithKit"), "--reproduce", "nonsense"}).exitCode,
              2);
}

} // namespace
