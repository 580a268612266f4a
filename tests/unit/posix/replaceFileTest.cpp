// SPDX-License-Identifier: BSL-1.0
// Tests the replacement of files with what only POSIX has: a full medium, symlinks and permissions.
#include "components/componentManager/exceptions.h"
#include "tests/support/fullMedium.h"
#include "tests/unit/replaceFileFixture.h"

#include <sys/stat.h>

using namespace Mz;
using namespace Mz::Test;

namespace {

TEST_F(ReplaceFile, KeepsTheOldOneWhenTheMediumIsFull) {
    put(file, "old");
    const auto fill = [](std::size_t size) {
        return [size](std::ostream& out) {
            out.write(std::string(size, 'x').data(), static_cast<std::streamsize>(size));
        };
    };
    const FullMedium full(1000);
    replaceFile(file, fill(1000));
    EXPECT_EQ(content().size(), 1000U);
    // The failure occurs in a write or only in the final flush, depending on the size.
    for (const std::size_t size : {1001U, 5000U, 100000U}) {
        EXPECT_THROW(replaceFile(file, fill(size)), QrStreamEx::ExWriteError) << size;
        EXPECT_EQ(content(), std::string(1000, 'x'));
        EXPECT_EQ(filesInFolder(), 1U);
    }
}

TEST_F(ReplaceFile, KeepsSymbolicLinksAndPermissions) {
    const std::filesystem::path link = folder.path() / "link";
    put(file, "old");
    std::filesystem::permissions(file, std::filesystem::perms(0640));
    std::filesystem::create_symlink(file.filename(), link);
    put(link, "new");
    EXPECT_TRUE(std::filesystem::is_symlink(link));
    EXPECT_EQ(content(), "new");
    EXPECT_EQ(std::filesystem::status(file).permissions(), std::filesystem::perms(0640));
}

TEST_F(ReplaceFile, CreatesTheTargetOfADanglingSymlink) {
    std::filesystem::create_directory(folder.path() / "sub");
    const std::filesystem::path link = folder.path() / "link", second = folder.path() / "second";
    std::filesystem::create_symlink("sub/target", link);
    std::filesystem::create_symlink(link, second);
    put(second, "new");
    EXPECT_TRUE(std::filesystem::is_symlink(link));
    EXPECT_TRUE(std::filesystem::is_symlink(second));
    EXPECT_TRUE(std::filesystem::is_regular_file(
        std::filesystem::symlink_status(folder.path() / "sub" / "target")));
    EXPECT_EQ(contentOf(folder.path() / "sub" / "target"), "new");
    put(link, "newer");
    EXPECT_EQ(contentOf(folder.path() / "sub" / "target"), "newer");
    EXPECT_EQ(filesInFolder(), 3U);
}

TEST_F(ReplaceFile, RefusesSymlinksInACircleAndThoseIntoNoFolder) {
    const std::filesystem::path circle = folder.path() / "circle", lost = folder.path() / "lost";
    std::filesystem::create_symlink("circle", circle);
    std::filesystem::create_symlink("no folder/target", lost);
    for (const std::filesystem::path& link : {circle, lost}) {
        EXPECT_THROW(put(link, "new"), QrStreamEx::ExWriteOpen) << link;
        EXPECT_TRUE(std::filesystem::is_symlink(link));
    }
    EXPECT_EQ(filesInFolder(), 2U);
}

TEST_F(ReplaceFile, KeepsTheOldOneWhenTheNewOneIsRemovedMeanwhile) {
    put(file, "old");
    EXPECT_THROW(replaceFile(file,
                             [&](std::ostream& out) {
                                 out << "new";
                                 for (const auto& entry :
                                      std::filesystem::directory_iterator(folder.path()))
                                     if (entry.path() != file)
                                         std::filesystem::remove(entry.path());
                             }),
                 QrStreamEx::ExWriteError);
    EXPECT_EQ(content(), "old");
    EXPECT_EQ(filesInFolder(), 1U);
}

TEST_F(ReplaceFile, RefusesAPipeWithoutOpeningIt) {
    ASSERT_EQ(::mkfifo(file.c_str(), 0600), 0);
    EXPECT_THROW(put(file, "x"), QrStreamEx::ExWriteOpen);
    EXPECT_TRUE(std::filesystem::is_fifo(file));
    EXPECT_EQ(filesInFolder(), 1U);
}

TEST_F(ReplaceFile, KeepsPermissionsThatForbidReadingAndWriting) {
    put(file, "old");
    std::filesystem::permissions(file, std::filesystem::perms(0040));
    put(file, "new");
    EXPECT_EQ(std::filesystem::status(file).permissions(), std::filesystem::perms(0040));
    std::filesystem::permissions(file, std::filesystem::perms(0600));
    EXPECT_EQ(content(), "new");
}

} // namespace
