// SPDX-License-Identifier: BSL-1.0
/// Tests file names that only some systems allow.
#include "tests/tools/toolsFixture.h"

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

} // namespace
