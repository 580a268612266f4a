// SPDX-License-Identifier: BSL-1.0
/// Tests what happens when a host unloads the component manager, or a plug-in that uses it, before
/// the process ends. Each test runs the program loadingHost.
#include "tests/integration/managerFixture.h"

using namespace Mz::Test;

namespace {

class UnloadedManager : public ManagerTest {
  protected:
    UnloadedManager() { manager.reset(); }

    static std::filesystem::path library() {
        return buildFolder / MZ_LIBRARY_FOLDER / (L"libMZcomponentManager" MZ_LIBRARY_EXTENSION);
    }
    static std::filesystem::path plugIn() {
        return buildFolder / MZ_LIBRARY_FOLDER / (L"plugIn" MZ_LIBRARY_EXTENSION);
    }

    /// Returns the output of a host that loads the manager's library. Expects exit code 0.
    std::string outputWithLibrary(const std::string& mode) {
        return outputOf({library().string(), "QrGetComponentManager", mode});
    }

    /// Returns the output of a host that loads only a plug-in, which needs the manager's library.
    std::string outputWithPlugIn(const std::string& mode) {
        return outputOf({plugIn().string(), "managerOfPlugIn", mode});
    }

  private:
    std::string outputOf(std::vector<std::string> arguments) {
        const std::filesystem::path component = add(L"goodWithKit");
        for (const std::filesystem::path& file : {component, plugIn(), library()})
            arguments.push_back(file.string());
        const ProgramResult result =
            runProgram(buildFolder / "bin" / (std::wstring(L"loadingHost") + MZ_PROGRAM_EXTENSION),
                       "loadingHost", arguments, folder.path());
        EXPECT_TRUE(result.finished);
        EXPECT_EQ(result.exitCode, 0);
        return result.output;
    }
};

const std::string allGone =
    "unmapped goodWithKit\nunmapped plugIn\nunmapped libMZcomponentManager\n";
const std::string libraryStays =
    "mapped goodWithKit\nunmapped plugIn\nmapped libMZcomponentManager\n";

TEST_F(UnloadedManager, IsGoneAfterEachOfManyCyclesWithoutComponents) {
    EXPECT_EQ(outputWithLibrary("cycles"), allGone);
    EXPECT_EQ(outputWithPlugIn("cycles"), allGone + "first 300\nlast 300\n");
}

TEST_F(UnloadedManager, IsGoneAfterManyCyclesOnSeveralThreads) {
    EXPECT_EQ(outputWithLibrary("threads"), allGone);
}

TEST_F(UnloadedManager, LeavesNoMemoryBehindThoughItsRegistriesHadEntries) {
    EXPECT_EQ(outputWithLibrary("growth"), "did not grow\n" + allGone);
}

TEST_F(UnloadedManager, LeavesNoMemoryBehindThoughAPlugInUsedItsRegistriesAndStreams) {
    EXPECT_EQ(outputWithPlugIn("growth"), "did not grow\n" + allGone);
}

TEST_F(UnloadedManager, StaysOnceItLoadedAComponentAndTheProcessEndsWell) {
    EXPECT_EQ(outputWithLibrary("component"), libraryStays);
}

TEST_F(UnloadedManager, StaysOnceAPlugInLoadedAComponentAndTheProcessEndsWell) {
    // Inline functions that both contain may bind to the plug-in, which then stays mapped too.
    const std::string output = outputWithPlugIn("component");
    EXPECT_THAT(output, ::testing::StartsWith("mapped goodWithKit\n"));
    EXPECT_THAT(output, ::testing::HasSubstr("\nmapped libMZcomponentManager\n"));
}

TEST_F(UnloadedManager, StaysAfterAThreadLoadedAComponentAndTheProcessEndsWell) {
    EXPECT_EQ(outputWithLibrary("thread"), libraryStays);
}

TEST_F(UnloadedManager, StaysInACopyOfTheProcessAndBothEndWell) {
    EXPECT_EQ(outputWithLibrary("copy"), "the copy ended with 0\n" + libraryStays);
}

} // namespace
