// SPDX-License-Identifier: BSL-1.0
/// Tests what the tools report of folders that the user may not enter, of files that the user may
/// not read, and of files that are not regular.
#include "components/componentTools/disabled.h"
#include "components/componentTools/start.h"
#include "tests/tools/posix/ordinaryUser.h"
#include "tests/tools/toolsFixture.h"

#include <clocale>
#include <sys/stat.h>

using namespace Mz;
using namespace Mz::Tools;
using namespace Mz::Test;

namespace {

class Place : public ToolsTest {
  protected:
    /// Returns a folder that may not be entered, with a component in it.
    std::filesystem::path closedFolder() {
        const std::filesystem::path closed = folder.path() / "closed";
        std::filesystem::create_directory(closed);
        std::filesystem::rename(add(L"goodByHand", "good.so"), closed / "good.so");
        std::filesystem::permissions(closed, std::filesystem::perms(mode));
        return closed;
    }
    ~Place() override {
        std::error_code ignored;
        std::filesystem::permissions(folder.path() / "closed", std::filesystem::perms::owner_all,
                                     ignored);
    }
    unsigned int mode = 0;
};

TEST_F(Place, OfAPipeIsThatOfNoRegularFile) {
    const std::filesystem::path pipe = folder.path() / "pipe";
    ASSERT_EQ(::mkfifo(pipe.c_str(), 0600), 0);
    const Finding verdict = explainFile(pipe).verdict;
    EXPECT_EQ(verdict.verdict, Verdict::notRegular);
    const SwitchResult result = disableComponent(pipe, folder.path() / "list");
    EXPECT_EQ(result.problem, displayName(pipe) + L": " + sentenceOf(verdict));
    EXPECT_FALSE(result.changed);
}

TEST_F(Place, OfAFileThatMayNotBeReadIsThatOfAnUnreadableOne) {
    const std::filesystem::path file = add(L"goodByHand");
    std::filesystem::permissions(file, std::filesystem::perms::none);
    const OrdinaryUser user;
    EXPECT_EQ(explainFile(file).verdict.verdict, Verdict::unreadable);
}

TEST_F(Place, InAFolderThatMayNotBeEnteredIsUnreachable) {
    const std::filesystem::path closed = closedFolder();
    const OrdinaryUser user;
    EXPECT_EQ(explainFile(closed / "good.so").verdict.verdict, Verdict::unreachable);
    EXPECT_EQ(explainFile(closed / "nothing.so").verdict.verdict, Verdict::unreachable);
    const Discovery inside = discover({closed / "folder"});
    ASSERT_EQ(inside.leftOut.size(), 1u);
    EXPECT_EQ(inside.leftOut[0].finding.verdict, Verdict::unreachable);
    const Discovery itself = discover({closed});
    ASSERT_EQ(itself.leftOut.size(), 1u);
    EXPECT_EQ(itself.leftOut[0].finding.verdict, Verdict::unreadable);
}

TEST_F(Place, InAFolderThatMayBeListedAndNotEnteredIsUnreachable) {
    mode = 0444;
    const std::filesystem::path closed = closedFolder();
    const OrdinaryUser user;
    ScanOptions options;
    options.folders = {closed};
    const ScanResult result = scan(options);
    ASSERT_EQ(result.files.size(), 1u);
    EXPECT_EQ(result.files[0].verdict.verdict, Verdict::unreachable);
}

/// A folder with a component, and a list in a folder that everybody may change.
class ForOrdinaryUser : public Place {
  protected:
    ForOrdinaryUser() {
        std::filesystem::permissions(lists.path(), std::filesystem::perms::all);
        options.folders = {folder.path()};
        options.list = lists.path() / "list";
        options.probe = patient();
    }
    ~ForOrdinaryUser() override { // So that the folder can be removed.
        std::filesystem::permissions(lists.path(), std::filesystem::perms::all);
    }

    TemporaryDirectory lists;
    const std::filesystem::path file = add(L"goodWithKit");
    ScanOptions options;
};

TEST_F(ForOrdinaryUser, AScanKeepsTheRecordOfAFileThatMayNotBeRead) {
    std::filesystem::remove(file);
    const std::filesystem::path faulty = add(L"missesDependency");
    ASSERT_EQ(scan(options).files.at(0).verdict.verdict, Verdict::dependencyMissing);
    const std::string list = contentOf(options.list);
    std::filesystem::permissions(faulty, std::filesystem::perms::none);
    const OrdinaryUser user;
    const ScanResult result = scan(options); // It would try the file again.
    ASSERT_EQ(result.files.size(), 1u);
    EXPECT_EQ(result.files[0].verdict.verdict, Verdict::unreadable);
    EXPECT_TRUE(result.files[0].recorded);
    EXPECT_EQ(result.notWritten, L"");
    EXPECT_EQ(contentOf(options.list), list);
    const RecordedLibraries kept = readRecordedList(options.list).libraries;
    ASSERT_EQ(kept.size(), 1u);
    EXPECT_EQ(kept[0].kept.value_or(Finding()).verdict, Verdict::dependencyMissing);
}

TEST_F(ForOrdinaryUser, AScanTriesAFileAgainThatCouldNotBeRead) {
    std::filesystem::permissions(file, std::filesystem::perms::none);
    {
        const OrdinaryUser user;
        const ScanResult result = scan(options);
        ASSERT_EQ(result.libraries.size(), 1u);
        EXPECT_TRUE(result.libraries[0].builders.empty());
        EXPECT_EQ(result.libraries[0].kept.value_or(Finding()).verdict, Verdict::unreadable);
    }
    std::filesystem::permissions(file, std::filesystem::perms::owner_all);
    EXPECT_EQ(scan(options).files.at(0).verdict.verdict, Verdict::works);
}

TEST_F(ForOrdinaryUser, AStartWorksWhereNoMarkCanBeLeft) {
    const auto host = buildFolder / "bin" / "startHost";
    ASSERT_EQ(runProgram(host, host.string(), {options.list.string(), folder.path().string()},
                         lists.path())
                  .output,
              "1 builders, left out\n");
    for (int scans = 0; scans < 2; ++scans) // Then there is nothing to write.
        EXPECT_EQ(scan(options).notWritten, L"");
    std::filesystem::permissions(lists.path(), std::filesystem::perms(0555));
    const OrdinaryUser user;
    const Kit::Started started = Kit::start(options.list, folder.path());
    EXPECT_TRUE(started);
    EXPECT_EQ(started.scanned().notWritten, L"");
    EXPECT_EQ(started.problem(),
              displayName(options.list) +
                  L": no mark can be left beside this list, so the next start cannot tell whether "
                  L"this one ended cleanly");
}

TEST_F(ForOrdinaryUser, AScanWritesNothingIfTheChoicesOfTheUserCannotBeRead) {
    scan(options);
    const std::filesystem::path verdicts = verdictsFileOf(options.list);
    std::filesystem::remove(verdicts);
    std::filesystem::create_symlink("/proc/self/mem", verdicts); // A read fails.
    add(L"countedDescription");
    const ScanResult result = scan(options);
    EXPECT_EQ(result.notWritten, displayName(verdicts) + L": nothing was written, for this file "
                                                         L"could not be read");
    EXPECT_EQ(result.libraries.size(), 2u);
    EXPECT_EQ(readRecordedList(options.list).libraries.size(), 1u);
}

} // namespace
