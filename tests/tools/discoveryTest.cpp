// SPDX-License-Identifier: BSL-1.0
// Tests which files of the folders of a search path are candidates.
#include "components/componentTools/discovery.h"
#include "tests/tools/toolsFixture.h"

using namespace Mz;
using namespace Mz::Tools;
using namespace Mz::Test;

namespace {

class Discover : public ToolsTest {
  protected:
    /// Returns the names of the candidates, each followed by a blank.
    static std::string names(const Discovery& discovery) {
        std::string all;
        for (const Candidate& candidate : discovery.candidates)
            all += candidate.path.filename().string() + " ";
        return all;
    }
};

TEST_F(Discover, ListsEachFileOfAFolderOnceThoughTheFolderIsNamedTwice) {
    folder.write("a", "text");
    folder.write("b", "text");
    const Discovery discovery = discover({folder.path(), folder.path()});
    EXPECT_EQ(names(discovery), "a b ");
    EXPECT_TRUE(discovery.leftOut.empty());
}

TEST_F(Discover, LeavesOutWhatIsNoFolder) {
    const std::filesystem::path file = folder.write("a", "text"), absent = folder.path() / "absent";
    const Discovery discovery = discover({file, absent});
    EXPECT_TRUE(discovery.candidates.empty());
    ASSERT_EQ(discovery.leftOut.size(), 2u);
    EXPECT_EQ(discovery.leftOut[0].path, file);
    EXPECT_EQ(discovery.leftOut[0].finding.verdict, Verdict::notAFolder);
    EXPECT_EQ(discovery.leftOut[1].path, absent);
    EXPECT_EQ(discovery.leftOut[1].finding.verdict, Verdict::missing);
    EXPECT_TRUE(discovery.leftOut[0].folder && discovery.leftOut[1].folder);
}

} // namespace
