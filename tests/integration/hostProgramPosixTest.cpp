// SPDX-License-Identifier: BSL-1.0
/// Tests host programs on Linux: which faults of a component terminate the process, and how a
/// program is affected by its own address and the locale. Each test runs the program testHost.
#include "tests/integration/managerFixture.h"

using namespace Mz::Test;

namespace {

class EndingHost : public ManagerTest {
  protected:
    ProgramResult runOn(const std::wstring& component, std::vector<std::string> options = {}) {
        add(component);
        add(L"goodWithKit", "zz");
        options.push_back(folder.path().string());
        return runProgram(buildFolder / "bin" / "testHost", "testHost", options, folder.path());
    }

    /// Expects that `component` causes a call of std::terminate, whatever handlers the host has.
    void expectTerminated(const std::wstring& component, const std::vector<std::string>& options) {
        const ProgramResult result = runOn(component, options);
        EXPECT_TRUE(result.finished);
        EXPECT_EQ(result.output, "terminated\n");
        EXPECT_EQ(result.exitCode, 99);
    }
};

TEST_F(EndingHost, IsEndedByTheSystemWhenAnInitialiserThrows) {
    const ProgramResult result = runOn(L"throwsInInitialiser");
    EXPECT_FALSE(result.finished);
    EXPECT_EQ(result.output, "");
}

TEST_F(EndingHost, IsTerminatedByAnInitialiserThatThrowsThoughItCatchesExceptions) {
    expectTerminated(L"throwsInInitialiser", {"--catching"});
}

TEST_F(EndingHost, IsTerminatedByAnInitialiserThatThrowsOnAThread) {
    expectTerminated(L"throwsInInitialiser", {"--catching", "--in-thread"});
}

TEST_F(EndingHost, IsTerminatedByAnInitialiserThatEndsItsThread) {
    expectTerminated(L"endsThreadInInitialiser", {"--catching", "--in-thread"});
}

TEST_F(EndingHost, IsTerminatedByAFinaliserThatThrows) {
    expectTerminated(L"throwsInFinaliser", {"--catching"});
}

TEST_F(EndingHost, IsNotEndedByAnEntryPointThatThrows) {
    const ProgramResult result = runOn(L"throwsInEntryPoint");
    EXPECT_TRUE(result.finished);
    EXPECT_EQ(result.output, "made kit\ndone\n");
}

class Host : public ManagerTest {
  protected:
    /// Runs `program` with `name` as its argv[0], and returns its output.
    std::string outputOf(const std::filesystem::path& program, const std::string& name,
                         const std::vector<std::string>& arguments) {
        const ProgramResult result = runProgram(program, name, arguments, folder.path());
        EXPECT_TRUE(result.finished);
        return result.output;
    }
};

TEST_F(Host, UsesALibraryThatStandsAtTheAddressItWants) {
    add(L"ownAddress");
    for (const char* program : {"testHost", "testHostAtAddress"})
        EXPECT_EQ(outputOf(buildFolder / "bin" / program, program, {folder.path().string()}),
                  "made kit\ndone\n")
            << program;
}

TEST_F(Host, SearchesNothingWhenTheLocaleHasNoFormForItsOwnFolder) {
    add(L"goodWithKit"); // The current folder of the program.
    const std::filesystem::path own = folder.path() / "lat\xE9";
    std::filesystem::create_directory(own);
    std::filesystem::copy_file(builtComponent(L"offersNothing"), own / "nothing.so");
    std::filesystem::copy_file(builtComponent(L"ownAddress"), own / "own.so");
    const std::filesystem::path program = buildFolder / "bin" / "testHost";
    const std::string name = own.string() + "/testHost";
    EXPECT_EQ(outputOf(program, name, {}), "made kit\ndone\n");
    EXPECT_EQ(outputOf(program, name, {"--locale", "C.UTF-8"}), "done\n");
}

} // namespace
