// SPDX-License-Identifier: BSL-1.0
/// Tests that a component can end the process from every place where it is called. Each test runs
/// the program exitHost.
#include "tests/support/temporaryDirectory.h"
#include "tests/support/testSystem.h"

#include <gtest/gtest.h>

#include <filesystem>
#include <string>

using namespace Mz::Test;

namespace {

ProgramResult runHost(const std::string& place) {
    const std::filesystem::path build = MZ_BUILD_PATH;
    TemporaryDirectory folder;
    const auto file = folder.write("input.exit", "x");
    setEnvironment("MZ_TEST_EXIT_AT", place);
    return runProgram(build / "bin" / (std::wstring(L"exitHost") + MZ_PROGRAM_EXTENSION),
                      "exitHost", {(build / "components" / "exiting").string(), file.string()},
                      folder.path());
}

class ComponentThatExits : public testing::TestWithParam<const char*> {};

TEST_P(ComponentThatExits, EndsTheProcessWithItsStatus) {
    const ProgramResult result = runHost(GetParam());
    EXPECT_TRUE(result.finished);
    EXPECT_EQ(result.exitCode, 43);
    EXPECT_EQ(result.output, "end\n");
}

INSTANTIATE_TEST_SUITE_P(, ComponentThatExits,
                         testing::Values("initialiser", "entry point", "label", "enumerate",
                                         "createBuilder", "createObject", "thread", "translator",
                                         "write", "read", "destructor", "canImport", "import"));

TEST(ComponentThatDoesNotExit, LeavesTheStatusToTheHost) {
    const ProgramResult result = runHost("nowhere");
    EXPECT_TRUE(result.finished);
    EXPECT_EQ(result.exitCode, 7);
    EXPECT_EQ(result.output, "end\n");
}

} // namespace
