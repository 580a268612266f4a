// SPDX-License-Identifier: BSL-1.0
/// Tests what the tools report of folders that the user may not enter.
#include "tests/tools/toolsFixture.h"

#include <clocale>
#include <sys/stat.h>
#include <unistd.h>

using namespace Mz;
using namespace Mz::Tools;
using namespace Mz::Test;

namespace {

/// While it lives, the process does not run as the superuser, whom permissions do not restrict.
class OrdinaryUser {
  public:
    OrdinaryUser() : previous(::geteuid()) {
        if (previous == 0)
            static_cast<void>(::seteuid(nobody));
    }
    ~OrdinaryUser() {
        if (previous == 0)
            static_cast<void>(::seteuid(0));
    }
    OrdinaryUser(const OrdinaryUser&) = delete;
    OrdinaryUser& operator=(const OrdinaryUser&) = delete;

  private:
    static constexpr uid_t nobody = 65534;
    uid_t previous;
};

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

} // namespace
