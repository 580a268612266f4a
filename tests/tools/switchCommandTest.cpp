// SPDX-License-Identifier: BSL-1.0
// The commands that switch components off and on.
#include "tests/tools/toolsFixture.h"

using namespace Mz;
using namespace Mz::Test;
using ::testing::HasSubstr;

namespace {

class SwitchCommands : public ToolsTest {
  protected:
    TemporaryDirectory lists;
};

TEST_F(SwitchCommands, SwitchOffAndOnAndShowTheReason) {
    const std::string cache = (lists.path() / "list").string(), name = add(L"goodWithKit").string();
    const auto command = [&](std::vector<std::string> arguments) {
        arguments.insert(arguments.end(), {"--cache", cache});
        return runCommandLine(arguments, lists.path());
    };
    EXPECT_EQ(command({"scan", "--path", folder.path().string()}).exitCode, 0);
    const ProgramResult off = command({"disable", name, "--reason", "too slow"});
    EXPECT_EQ(off.exitCode, 0);
    EXPECT_THAT(off.output, HasSubstr(": switched off\n"));
    const ProgramResult listed = command({"list", "--path", folder.path().string()});
    EXPECT_EQ(listed.exitCode, 0);
    EXPECT_THAT(listed.output, HasSubstr("disabledByUser"));
    EXPECT_THAT(listed.output, HasSubstr("switched off in the list (too slow)"));
    EXPECT_EQ(command({"explain", name}).exitCode, 1);
    EXPECT_EQ(command({"explain", "--load", name}).exitCode, 1);
    const ProgramResult again = command({"scan", "--path", folder.path().string()});
    EXPECT_EQ(again.exitCode, 0);
    EXPECT_THAT(again.output, HasSubstr("switched off in the list (too slow)"));
    EXPECT_THAT(command({"enable", name}).output, HasSubstr(": switched on\n"));
    EXPECT_THAT(command({"enable", name}).output, HasSubstr(": was not switched off\n"));
    const ProgramResult absent = command({"disable", "absent", name});
    EXPECT_EQ(absent.exitCode, 1);
    EXPECT_THAT(absent.output, HasSubstr(": switched off\n")); // The second, nevertheless.
    EXPECT_EQ(runCommandLine({"disable", name}, lists.path()).exitCode, 2);
}

} // namespace
