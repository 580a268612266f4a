// SPDX-License-Identifier: BSL-1.0
// The command that searches the component with which a host fails.
#include "tests/tools/toolsFixture.h"

#include <nlohmann/json.hpp>

using namespace Mz;
using namespace Mz::Test;
using ::testing::HasSubstr;
using Json = nlohmann::json;

namespace {

class BisectCommand : public ToolsTest {
  protected:
    ProgramResult run(std::vector<std::string> options, std::vector<std::string> host = {}) const {
        options.insert(options.begin(), {"bisect", "--path", folder.path().string(), "--cache",
                                         (work.path() / "list").string()});
        if (host.empty())
            host = {(buildFolder / "bin" / "bisectHost").string(), "own", folder.path().string()};
        options.push_back("--");
        options.insert(options.end(), host.begin(), host.end());
        return runCommandLine(options, work.path());
    }

    TemporaryDirectory work;
};

TEST_F(BisectCommand, ReportsTheComponentsThatFailTogether) {
    add(L"failsWithSecond", "a");
    add(L"failsWithFirst", "b");
    add(L"goodWithKit", "c");
    const ProgramResult result = run({});
    EXPECT_EQ(result.exitCode, 0);
    for (const char* part :
         {"the host fails with these 2 components together", "works: it loads", "stamp: SOVERSION",
          "builder ", "its last failure: exit status 7", "3 components", "mzcomponents 0."})
        EXPECT_THAT(result.output, HasSubstr(part));
    const Json json = Json::parse(run({"--json"}).output);
    EXPECT_EQ(json.at("result"), "found");
    EXPECT_EQ(json.at("culprits").size(), 2u);
    EXPECT_EQ(json.at("culprits").at(0).at("verdict"), "works");
    EXPECT_EQ(json.at("host").at(1), "own");
    EXPECT_EQ(json.at("components"), 3);
}

TEST_F(BisectCommand, EndsWithOneWhereNoComponentIsFound) {
    add(L"goodWithKit");
    const ProgramResult good = run({});
    EXPECT_EQ(good.exitCode, 1);
    EXPECT_THAT(good.output, HasSubstr("the host does not fail with all components"));
    const ProgramResult bad = run({}, {(buildFolder / "bin" / "bisectHost").string()});
    EXPECT_EQ(bad.exitCode, 1);
    EXPECT_THAT(bad.output, HasSubstr("does not use Kit::listFromEnvironment"));
    const ProgramResult absent = run({}, {(work.path() / "absent").string()});
    EXPECT_EQ(absent.exitCode, 1);
    EXPECT_THAT(absent.output, HasSubstr("the host cannot be started"));
}

TEST_F(BisectCommand, NeedsAHostAndAList) {
    EXPECT_EQ(runCommandLine({"bisect", "--cache", "list"}, work.path()).exitCode, 2);
    EXPECT_EQ(runCommandLine({"bisect", "--", "host"}, work.path()).exitCode, 2);
    EXPECT_EQ(run({"--repeat", "0"}).exitCode, 2);
}

TEST_F(BisectCommand, StopsTheQuestionsAtTheEndOfTheInput) {
    add(L"goodWithKit");
    const ProgramResult result = run({"--ask"});
    EXPECT_EQ(result.exitCode, 1);
    EXPECT_THAT(result.output, HasSubstr("the search was stopped"));
}

} // namespace
