// SPDX-License-Identifier: BSL-1.0
// Tests the program's folder and full paths.
#include "components/componentKit/hostKit.h"
#include "tests/support/temporaryDirectory.h"

#include <gtest/gtest.h>

using namespace Mz;

namespace {

const std::filesystem::path buildFolder = MZ_BUILD_PATH;

TEST(ProgramFolder, IsThatOfTheProgramsFile) {
    EXPECT_TRUE(Kit::programFolder().is_absolute());
    EXPECT_TRUE(std::filesystem::equivalent(Kit::programFolder(), buildFolder / "internals"));
    EXPECT_EQ(Kit::programFolder(), programFolder());
}

TEST(ProgramFolder, IsTheSameWhereverTheProcessIs) {
    const std::filesystem::path before = std::filesystem::current_path(), was = programFolder();
    std::filesystem::current_path(std::filesystem::temp_directory_path());
    EXPECT_EQ(programFolder(), was);
    std::filesystem::current_path(before);
}

TEST(FullPath, HasNoDotsAndNoSeparatorAtItsEnd) {
    const std::filesystem::path here = std::filesystem::current_path();
    EXPECT_EQ(fullPath("a/./b/../c"), here / "a" / "c");
    EXPECT_EQ(fullPath("a/"), here / "a");
    EXPECT_EQ(fullPath("a//b"), here / "a" / "b");
    EXPECT_EQ(fullPath("."), here);
    EXPECT_EQ(fullPath(here.root_path()), here.root_path());
    EXPECT_EQ(fullPath(here / "x" / ".." / ".."), here.parent_path());
}

} // namespace
