// SPDX-License-Identifier: BSL-1.0
/// Tests files beside a list that cannot be read.
#include "components/componentTools/records/openPatiently.h"
#include "components/componentTools/records/replaceChanged.h"
#include "components/componentTools/starting/changes.h"
#include "tests/support/temporaryDirectory.h"
#include "tests/tools/posix/ordinaryUser.h"

#include <gtest/gtest.h>

#include <filesystem>
#include <fstream>
#include <iterator>
#include <string>
#include <sys/stat.h>

using namespace Mz::Tools;
using namespace Mz::Test;

namespace {

class RecordFile : public testing::Test {
  protected:
    RecordFile() { std::filesystem::permissions(folder.path(), std::filesystem::perms::all); }

    /// Returns a file that only its owner may write and no one may read.
    std::filesystem::path unreadable(const std::string& content) const {
        const std::filesystem::path file = folder.write("file", content);
        std::filesystem::permissions(file, std::filesystem::perms::owner_write);
        return file;
    }

    static ino_t numberOf(const std::filesystem::path& file) {
        struct stat status {};
        EXPECT_EQ(::stat(file.c_str(), &status), 0);
        return status.st_ino;
    }

    TemporaryDirectory folder;
};

TEST_F(RecordFile, ThatCannotBeOpenedIsGivenUp) {
    const std::filesystem::path file = unreadable("content");
    const OrdinaryUser user;
    std::ifstream stream;
    EXPECT_FALSE(openPatiently(stream, file));
    EXPECT_FALSE(stream.is_open());
}

TEST_F(RecordFile, ThatIsNoRegularFileIsNotOpened) {
    const std::filesystem::path pipe = folder.path() / "pipe";
    ASSERT_EQ(::mkfifo(pipe.c_str(), 0600), 0); // Opening it would block.
    std::ifstream stream;
    EXPECT_FALSE(openPatiently(stream, pipe));
    EXPECT_FALSE(openPatiently(stream, folder.path()));
    EXPECT_FALSE(openPatiently(stream, folder.path() / "absent"));
}

TEST_F(RecordFile, WithThisContentIsReplacedOnlyIfThatCannotBeSeen) {
    const std::filesystem::path file = folder.write("file", "content");
    const ino_t number = numberOf(file);
    replaceChanged(file, "content");
    EXPECT_EQ(numberOf(file), number);
    unreadable("content");
    {
        const OrdinaryUser user;
        replaceChanged(file, "content");
    }
    EXPECT_NE(numberOf(file), number);
    std::filesystem::permissions(file, std::filesystem::perms::owner_all);
    std::ifstream stream(file);
    EXPECT_EQ(std::string(std::istreambuf_iterator<char>(stream), {}), "content");
}

TEST_F(RecordFile, OfStartsThatCannotBeReadIsTakenForMissing) {
    const std::filesystem::path list = folder.path() / "list";
    std::filesystem::create_symlink("/proc/self/mem", folder.path() / "list.starts.json");
    const RecordedLibraries components{{L"\\components", L"a", 10, 100, {}}};
    const LibraryNames all{{L"\\components", L"a"}};
    EXPECT_EQ(changedLast(list, components), all);
    EXPECT_EQ(changedLast(list, components), all);
}

} // namespace
