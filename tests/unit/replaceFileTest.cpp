// SPDX-License-Identifier: BSL-1.0
// Tests that replacing a file never loses the old one.
#include "components/componentManager/exceptions.h"
#include "components/componentManager/files.h"
#include "components/componentManager/nativeText.h"
#include "tests/unit/replaceFileFixture.h"
#include "tests/unit/unwritableFolder.h"

#include <algorithm>
#include <thread>
#include <vector>

using namespace Mz;
using namespace Mz::Test;

namespace {

TEST_F(ReplaceFile, IsWritten) {
    put(file, std::string_view("a\n\0b\r", 5));
    EXPECT_EQ(content(), std::string_view("a\n\0b\r", 5));
    EXPECT_EQ(filesInFolder(), 1U);
}

TEST_F(ReplaceFile, TakesThePlaceOfTheOldOne) {
    put(file, std::string(100000, 'x'));
    put(file, "short");
    EXPECT_EQ(content(), "short");
    put(file, "");
    EXPECT_EQ(content(), "");
    EXPECT_EQ(filesInFolder(), 1U);
}

TEST_F(ReplaceFile, LeavesTheOldOneUntilAllIsWritten) {
    put(file, "old");
    replaceFile(file, [&](std::ostream& out) {
        out << "new" << std::flush;
        EXPECT_EQ(content(), "old");
        EXPECT_EQ(filesInFolder(), 2U);
    });
    EXPECT_EQ(content(), "new");
}

TEST_F(ReplaceFile, KeepsTheOldOneWhenWritingThrows) {
    put(file, "old");
    const auto fails = [](std::ostream& out) {
        out << "half";
        throw std::runtime_error("in the middle");
    };
    EXPECT_THROW(replaceFile(file, fails), std::runtime_error);
    EXPECT_EQ(content(), "old");
    EXPECT_EQ(filesInFolder(), 1U);
    const std::filesystem::path other = folder.path() / "other";
    EXPECT_THROW(replaceFile(other, fails), std::runtime_error);
    EXPECT_FALSE(std::filesystem::exists(other));
    EXPECT_EQ(filesInFolder(), 1U);
}

TEST_F(ReplaceFile, KeepsTheOldOneWhenTheStreamFails) {
    put(file, "old");
    EXPECT_THROW(replaceFile(file,
                             [](std::ostream& out) {
                                 out << "half";
                                 out.setstate(std::ios::badbit);
                             }),
                 QrStreamEx::ExWriteError);
    EXPECT_THROW(replaceFile(file, [](std::ostream& out) { out.setstate(std::ios::failbit); }),
                 QrStreamEx::ExWriteError);
    EXPECT_EQ(content(), "old");
    EXPECT_EQ(filesInFolder(), 1U);
}

TEST_F(ReplaceFile, IsRefusedWithTheReasonWhereNoFileCanBe) {
    const std::filesystem::path impossible[] = {folder.path() / "no folder" / "file",
                                                unwritableFolder() / "file"};
    for (const std::filesystem::path& path : impossible) {
        bool called = false;
        try {
            replaceFile(path, [&](std::ostream&) { called = true; });
            FAIL() << path;
        } catch (const QrStreamEx::ExWriteOpen& failure) {
            EXPECT_THAT(failure.getReason(),
                        testing::StartsWith(utf8Name(path) + ": Error opening output stream\n"));
        }
        EXPECT_FALSE(called);
    }
}

TEST_F(ReplaceFile, IsRefusedInPlaceOfAFolder) {
    std::filesystem::create_directory(file);
    EXPECT_THROW(put(file, "x"), QrStreamEx::ExWriteOpen);
    EXPECT_TRUE(std::filesystem::is_directory(file));
    EXPECT_EQ(filesInFolder(), 1U);
}

TEST_F(ReplaceFile, IsRefusedIfAFolderTakesItsPlaceMeanwhile) {
    bool written = false;
    EXPECT_THROW(replaceFile(file,
                             [&](std::ostream& out) {
                                 out << "new";
                                 written = std::filesystem::create_directory(file);
                             }),
                 QrStreamEx::ExWriteOpen);
    EXPECT_TRUE(written);
    EXPECT_TRUE(std::filesystem::is_directory(file));
    EXPECT_EQ(filesInFolder(), 1U);
}

TEST_F(ReplaceFile, MayStandInTheCurrentFolder) {
    const std::filesystem::path before = std::filesystem::current_path();
    std::filesystem::current_path(folder.path());
    put("relative", "x");
    put("relative", "yy");
    std::filesystem::current_path(before);
    EXPECT_EQ(contentOf(folder.path() / "relative"), "yy");
}

TEST_F(ReplaceFile, NamesTheFileInUtf8) {
    const std::filesystem::path lost = folder.path() / u8"no \u00FC \u65E5" / "file";
    const std::string name = folder.path().string() + "/no \xC3\xBC \xE6\x97\xA5/file";
    try {
        put(lost, "x");
        FAIL();
    } catch (const QrStreamEx::ExWriteOpen& failure) {
        std::string reason = failure.getReason();
        std::replace(reason.begin(), reason.end(), '\\', '/');
        std::string expected = name;
        std::replace(expected.begin(), expected.end(), '\\', '/');
        EXPECT_THAT(reason, testing::StartsWith(expected + ": Error opening output stream\n"));
    }
}

TEST_F(ReplaceFile, WrittenByManyAtOnceIsAlwaysOneOfThemWhole) {
    put(file, std::string(1000, 'a'));
    std::vector<std::jthread> writers;
    for (const char letter : {'a', 'b', 'c', 'd'})
        writers.emplace_back([this, letter] {
            for (int round = 0; round < 10; ++round)
                put(file, std::string(100000, letter));
        });
    writers.clear();
    EXPECT_EQ(content(), std::string(100000, content().front()));
    EXPECT_EQ(filesInFolder(), 1U);
}

} // namespace
