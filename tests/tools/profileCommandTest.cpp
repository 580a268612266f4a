// SPDX-License-Identifier: BSL-1.0
/// `mzcomponents profile`, as people and scripts use it.
#include "tests/tools/toolsFixture.h"
#include "tests/tools/xmlCheck.h"

#include <nlohmann/json.hpp>

#include <numeric>

using namespace Mz;
using namespace Mz::Tools;
using namespace Mz::Test;
using ::testing::EndsWith;
using ::testing::HasSubstr;
using ::testing::StartsWith;
using Json = nlohmann::json;

namespace {

/// The sleep of a slow library in milliseconds, less the inaccuracy of the clocks.
constexpr double slow = 190;

class ProfileCommand : public ToolsTest {
  protected:
    ProgramResult run(std::vector<std::string> arguments) const {
        arguments.insert(arguments.begin(), {"profile", "--path", folder.path().string()});
        return runExactly(arguments);
    }

    ProgramResult runExactly(const std::vector<std::string>& arguments) const {
        return runCommandLine(arguments, work.path());
    }

    Json json(int status, std::vector<std::string> arguments = {}) const {
        arguments.insert(arguments.end(), {"--json", "--runs", "3"});
        const ProgramResult result = run(arguments);
        EXPECT_EQ(result.exitCode, status) << result.output;
        const Json value = Json::parse(result.output, nullptr, false);
        EXPECT_FALSE(value.is_discarded()) << result.output;
        return value;
    }

    static std::string fileNameIn(const Json& library) {
        const std::string file = library.at("file");
        return file.substr(file.find_last_of("/\\") + 1);
    }

    std::string inWork(const char* name) const { return (work.path() / name).string(); }

    TemporaryDirectory work;
};

TEST_F(ProfileCommand, AnswersWhichLibraryIsSlowInTheFirstLine) {
    add(L"goodWithKit", L"good");
    add(L"sleepsInInitialiser", L"slow");
    const ProgramResult result = run({"--runs", "1"});
    EXPECT_EQ(result.exitCode, 0);
    EXPECT_THAT(result.output, StartsWith("slow is the slowest library: it takes "));
    const std::string first = result.output.substr(0, result.output.find('\n'));
    EXPECT_THAT(first, HasSubstr(" %), of which "));
    EXPECT_THAT(first, EndsWith(" for load with initialisers."));
    for (const char* word : {"warm file cache", "share", "check", "probe", "description",
                             "registration", "other files", "listing the folders",
                             "the manager's own steps", "initialize", "scan --cache LIST"})
        EXPECT_THAT(result.output, HasSubstr(word));
    const std::size_t slowRow = result.output.rfind("slow\n");
    EXPECT_LT(slowRow, result.output.rfind("good\n"));
}

TEST_F(ProfileCommand, WritesAsJsonWhatTheTableHas) {
    add(L"goodWithKit", L"good");
    add(L"sleepsInDescription", L"slow");
    folder.write("text", "no library");
    const Json profile = json(0);
    EXPECT_THAT(std::string(profile.at("answer")), StartsWith("slow is the slowest library"));
    EXPECT_EQ(profile.at("runs"), 3);
    EXPECT_EQ(profile.at("fileCache"), "warm");
    EXPECT_EQ(profile.at("otherFiles").at("count"), 1);
    EXPECT_TRUE(profile.at("listReading").is_null());
    EXPECT_TRUE(profile.at("withoutList").is_null());
    double sum =
        profile.at("listing").get<double>() + profile.at("otherFiles").at("time").get<double>();
    ASSERT_EQ(profile.at("libraries").size(), 2u);
    for (const Json& library : profile.at("libraries")) {
        double time = 0;
        for (const char* phase :
             {"check", "probe", "loadWithInitialisers", "description", "registration"})
            time += library.at(phase).get<double>();
        EXPECT_NEAR(time, library.at("time").get<double>(), 0.001);
        EXPECT_TRUE(library.at("loaded").get<bool>() && library.at("measured").get<bool>());
        EXPECT_TRUE(library.at("record").is_null());
        EXPECT_EQ(library.at("verdict"), "works");
        sum += time;
    }
    const Json& slowest = profile.at("libraries").at(0);
    EXPECT_EQ(fileNameIn(slowest), "slow");
    EXPECT_GE(slowest.at("description").get<double>(), slow);
    EXPECT_GT(slowest.at("share").get<double>(), 0.3);
    EXPECT_NEAR(sum, profile.at("sum").get<double>(), 0.001);
    EXPECT_NEAR(profile.at("initialize").get<double>() - sum,
                profile.at("managersOwnSteps").get<double>(), 0.001);
}

TEST_F(ProfileCommand, EndsWithOneWhereALibraryIsFaultyAndMeasuresTheOthers) {
    add(L"crashesInEntryPoint", L"faulty");
    add(L"goodWithKit", L"good");
    const Json libraries = json(1).at("libraries");
    ASSERT_EQ(libraries.size(), 2u);
    EXPECT_EQ(fileNameIn(libraries.at(0)), "good");
    EXPECT_EQ(libraries.at(0).at("verdict"), "works");
    EXPECT_EQ(libraries.at(1).at("verdict"), "crashed");
    EXPECT_FALSE(libraries.at(1).at("measured").get<bool>());
    EXPECT_THAT(std::string(libraries.at(1).at("sentence")), HasSubstr("entry point"));
}

TEST_F(ProfileCommand, WithAListComparesBothStarts) {
    add(L"sleepsInInitialiser", L"slow");
    EXPECT_EQ(
        runExactly({"scan", "--cache", inWork("list"), "--path", folder.path().string()}).exitCode,
        0);
    add(L"goodWithKit", L"new");
    const Json profile = json(0, {"--cache", inWork("list")});
    EXPECT_LT(profile.at("initialize").get<double>(), slow);
    EXPECT_GT(profile.at("listReading").get<double>(), 0);
    EXPECT_GE(profile.at("withoutList").at("initialize").get<double>(), slow);
    for (const Json& library : profile.at("libraries"))
        EXPECT_EQ(library.at("record").at("verdict"),
                  fileNameIn(library) == "slow" ? "recordedUnchanged" : "notRecorded");
    const std::string text = run({"--runs", "1", "--cache", inWork("list")}).output;
    EXPECT_THAT(text, HasSubstr("new: is loaded in spite of the list: "));
    EXPECT_THAT(text, HasSubstr("reading the list"));
    EXPECT_THAT(text, HasSubstr("With the list the start takes "));
    EXPECT_EQ(json(1, {"--cache", inWork("missing")}).at("libraries").size(), 2u);
}

TEST_F(ProfileCommand, DrawsAChart) {
    add(L"goodWithKit", L"it's a & b");
    EXPECT_EQ(run({"--runs", "1", "--svg", inWork("chart.svg")}).exitCode, 0);
    const std::string chart = contentOf(work.path() / "chart.svg");
    EXPECT_EQ(XmlCheck::faultIn(chart), "") << chart;
    EXPECT_THAT(chart, HasSubstr("it&apos;s a &amp; b"));
    EXPECT_EQ(run({"--runs", "1", "--svg", inWork("missing/chart.svg")}).exitCode, 1);
}

TEST_F(ProfileCommand, OfAFolderWithoutLibrariesSaysSo) {
    const Json profile = json(0);
    EXPECT_TRUE(profile.at("libraries").empty());
    EXPECT_THAT(std::string(profile.at("answer")), EndsWith("no library was measured"));
    const ProgramResult missing = runExactly({"profile", "--path", inWork("missing"), "--json"});
    EXPECT_EQ(missing.exitCode, 1);
    EXPECT_EQ(Json::parse(missing.output).at("skippedFolders").size(), 1u);
}

TEST_F(ProfileCommand, WrongUseEndsWithTwo) {
    EXPECT_EQ(run({"--runs", "0"}).exitCode, 2);
    EXPECT_EQ(run({"--runs", "many"}).exitCode, 2);
    EXPECT_EQ(run({"--svg", ""}).exitCode, 2);
    EXPECT_EQ(run({"--cache", ""}).exitCode, 2);
    EXPECT_EQ(runExactly({"profile", "--path", ""}).exitCode, 2);
}

} // namespace
