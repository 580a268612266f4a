// SPDX-License-Identifier: BSL-1.0
/// Tests file names that only some systems allow.
#include "components/componentTools/disabled.h"
#include "components/componentTools/discovery.h"
#include "tests/tools/toolsFixture.h"

#include <clocale>
#include <filesystem>

using namespace Mz;
using namespace Mz::Tools;
using namespace Mz::Test;

namespace {

class StrangeNames : public ToolsTest {
  protected:
    TemporaryDirectory lists;
};

TEST_F(StrangeNames, AListWithABackSlashInAFileNameIsReadBackAndServesAHost) {
    add(L"goodWithKit", "a\\b.so");
    ScanOptions wanted;
    wanted.folders = {folder.path()};
    wanted.list = lists.path() / "list";
    wanted.probe = patient();
    ASSERT_EQ(scan(wanted).files.at(0).verdict.verdict, Verdict::works);

    const ListReading reading = readRecordedList(wanted.list);
    ASSERT_EQ(reading.state, ListReading::State::good);
    ASSERT_EQ(reading.libraries.size(), 1u);
    EXPECT_EQ(reading.libraries[0].fileName, L"a\\b.so");
    const ScanResult again = scan(wanted);
    EXPECT_EQ(again.rejected, L"");
    EXPECT_FALSE(again.files.at(0).looked);

    const auto host = buildFolder / "bin" / "recordedHost";
    EXPECT_EQ(runProgram(host, host.string(), {wanted.list.string(), folder.path().string()},
                         lists.path())
                  .output,
              "1 builders, 0 mapped, no word\n1 made\n");
}

TEST_F(StrangeNames, ThatDifferInCaseOnlyLeaveOneCandidate) {
    const std::filesystem::path first = add(L"goodByHand", "LIB.so");
    const std::filesystem::path second = add(L"goodWithKit", "lib.so");
    const Discovery discovery = discover({folder.path()});
    ASSERT_EQ(discovery.candidates.size(), 1u);
    EXPECT_EQ(discovery.candidates[0].path, first);
    EXPECT_EQ(discovery.candidates[0].fileName, L"lib.so");
    ASSERT_EQ(discovery.leftOut.size(), 1u);
    EXPECT_EQ(discovery.leftOut[0].path, second);
    EXPECT_EQ(discovery.leftOut[0].finding.verdict, Verdict::sameName);
    EXPECT_EQ(sentenceOf(discovery.leftOut[0].finding),
              L"its name differs from " + displayName(first) +
                  L" only in case, and a list can contain only one of them");
    EXPECT_FALSE(discovery.leftOut[0].folder);
}

TEST_F(StrangeNames, OfOneFileGiveOneCandidate) {
    const std::filesystem::path file = add(L"goodByHand", "b.so");
    std::filesystem::create_hard_link(file, folder.path() / "c.so");
    std::filesystem::create_symlink(file, folder.path() / "a.so");
    const Discovery discovery = discover({folder.path(), folder.path() / "."});
    ASSERT_EQ(discovery.candidates.size(), 1u);
    EXPECT_EQ(discovery.candidates[0].path, folder.path() / "a.so");
    EXPECT_TRUE(discovery.leftOut.empty());
}

TEST_F(StrangeNames, ThatAreNoTextCannotBeRecorded) {
    ASSERT_TRUE(std::setlocale(LC_ALL, "C.UTF-8"));
    const std::filesystem::path name = std::string("\xFF");
    const std::filesystem::path file = add(L"goodByHand", name);
    EXPECT_EQ(explainFile(file).verdict.verdict, Verdict::nameNotCarried);
    const SwitchResult result = disableComponent(file, lists.path() / "list");
    EXPECT_EQ(result.problem,
              displayName(file) +
                  L": its name has no form in the current locale, so it cannot be recorded");
    EXPECT_FALSE(result.changed);
    EXPECT_TRUE(std::filesystem::is_empty(lists.path()));
    // The name does not matter where the content shows that the file is no candidate.
    std::filesystem::remove(file);
    EXPECT_EQ(explainFile(folder.write(name, "text")).verdict.verdict, Verdict::notALibrary);
}

} // namespace
