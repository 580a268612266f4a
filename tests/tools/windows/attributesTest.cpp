// SPDX-License-Identifier: BSL-1.0
/// Tests what the tools report of files with attributes that only Windows has.
#include "components/componentTools/discovery.h"
#include "tests/tools/toolsFixture.h"

#include <windows.h>

using namespace Mz::Tools;
using namespace Mz::Test;

namespace {

class Attributes : public ToolsTest {
  protected:
    /// Returns the verdict on a component with these attributes, and expects that it is no
    /// candidate.
    Verdict verdictWith(DWORD attributes) {
        const std::filesystem::path file = add(L"goodByHand");
        EXPECT_TRUE(::SetFileAttributesW(file.c_str(), attributes));
        EXPECT_TRUE(discover({folder.path()}).candidates.empty());
        const Verdict verdict = explainFile(file).verdict.verdict;
        EXPECT_TRUE(::SetFileAttributesW(file.c_str(), FILE_ATTRIBUTE_NORMAL));
        return verdict;
    }
};

TEST_F(Attributes, OfTheSystemOrOfAHiddenFileMakeItNoCandidate) {
    EXPECT_EQ(verdictWith(FILE_ATTRIBUTE_SYSTEM), Verdict::systemFile);
    EXPECT_EQ(verdictWith(FILE_ATTRIBUTE_HIDDEN), Verdict::hidden);
    EXPECT_EQ(verdictWith(FILE_ATTRIBUTE_SYSTEM | FILE_ATTRIBUTE_HIDDEN), Verdict::hidden);
}

} // namespace
