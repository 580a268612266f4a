/// What ends a process on Linux, shown in a process of its own.
#include "tests/integration/managerFixture.h"

using namespace Mz::Test;

namespace {

class EndingHost : public ManagerTest {
  protected:
    ProgramResult runOn(const std::wstring& component) {
        add(component);
        add(L"goodWithKit", "zz");
        return runProgram(buildFolder / "bin" / "testHost", "testHost", {folder.path().string()},
                          folder.path());
    }
};

TEST_F(EndingHost, IsEndedByTheSystemWhenAnInitialiserThrows) {
    const ProgramResult result = runOn(L"throwsInInitialiser");
    EXPECT_FALSE(result.finished);
    EXPECT_EQ(result.output, "");
}

TEST_F(EndingHost, IsNotEndedByAnEntryPointThatThrows) {
    const ProgramResult result = runOn(L"throwsInEntryPoint");
    EXPECT_TRUE(result.finished);
    EXPECT_EQ(result.output, "made kit\ndone\n");
}

} // namespace
