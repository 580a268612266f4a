// SPDX-License-Identifier: BSL-1.0
// The search for other programs in PATH, which must not find one in the current folder.
#include "components/componentTools/platform/system.h"
#include "tests/support/temporaryDirectory.h"
#include "tests/support/testSystem.h"

#include <gtest/gtest.h>

#include <filesystem>
#include <string>

using namespace Mz::Tools;
using namespace Mz::Test;

namespace {

class FindProgram : public testing::Test {
  protected:
    /// Makes a program in a folder.
    static std::filesystem::path programIn(const TemporaryDirectory& folder) {
        std::filesystem::path program =
            folder.write(std::string("tool") + System::programExtension(), "");
        std::filesystem::permissions(program, std::filesystem::perms::owner_all);
        return program;
    }

    static std::filesystem::path find(const std::string& list) {
        setEnvironment("PATH", list);
        return System::findProgram("tool");
    }

    static std::string textOf(const TemporaryDirectory& folder) { return folder.path().string(); }

    const std::string separator{std::filesystem::path::preferred_separator == '/' ? ":" : ";"};
    TemporaryDirectory first;
    TemporaryDirectory second;
};

TEST_F(FindProgram, TakesTheFirstFolderThatHasIt) {
    const std::filesystem::path program = programIn(second);
    EXPECT_EQ(find(textOf(first) + separator + textOf(second)), program);
    EXPECT_EQ(find(separator + textOf(second) + separator), program);
    const std::filesystem::path other = programIn(first);
    EXPECT_EQ(find(textOf(first) + separator + textOf(second)), other);
    EXPECT_EQ(find(textOf(second) + separator + textOf(first)), program);
}

TEST_F(FindProgram, TakesTheWholeNameWithOrWithoutTheExtension) {
    programIn(first);
    const std::string name = "tool.one", extension = System::programExtension();
    const std::filesystem::path program = first.write(name + extension, "");
    std::filesystem::permissions(program, std::filesystem::perms::owner_all);
    setEnvironment("PATH", textOf(first));
    EXPECT_EQ(System::findProgram(name), program);
    EXPECT_EQ(System::findProgram(name + extension), program);
    EXPECT_EQ(System::findProgram("tool.two"), std::filesystem::path());
}

TEST_F(FindProgram, PassesOverFolders) {
    std::filesystem::create_directory(first.path() /
                                      (std::string("tool") + System::programExtension()));
    EXPECT_EQ(find(textOf(first)), std::filesystem::path());
}

TEST_F(FindProgram, LooksInTheCurrentFolderOnlyIfPathNamesItInFull) {
    const std::filesystem::path program = programIn(first);
    const std::filesystem::path before = std::filesystem::current_path();
    std::filesystem::current_path(first.path());
    for (const std::string& list :
         {std::string(), std::string("."), separator, separator + "." + separator})
        EXPECT_EQ(find(list), std::filesystem::path()) << list;
    EXPECT_EQ(find(textOf(first)), program);
    std::filesystem::current_path(before);
}

} // namespace
