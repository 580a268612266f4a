// SPDX-License-Identifier: BSL-1.0
// The marks that hosts leave beside a list, of which the latest one counts.
#include "components/componentTools/starting/startMark.h"
#include "tests/support/temporaryDirectory.h"

#include <gtest/gtest.h>

#include <chrono>
#include <filesystem>
#include <string>

using namespace Mz::Tools;
using namespace Mz::Test;
using namespace std::chrono_literals;

namespace {

class StartMarks : public testing::Test {
  protected:
    std::filesystem::path list() const { return folder.path() / "list"; }

    /// Leaves the mark of a host that has ended, so long ago.
    void leave(const std::string& number, const std::string& content, std::chrono::hours age) {
        const auto mark = folder.write("list.running-" + number, content);
        std::filesystem::last_write_time(mark, now - age);
    }

    std::size_t files() const {
        return static_cast<std::size_t>(
            std::distance(std::filesystem::directory_iterator(folder.path()), {}));
    }

    const std::filesystem::file_time_type now = std::filesystem::file_time_type::clock::now();
    TemporaryDirectory folder;
};

TEST_F(StartMarks, OfSeveralHostsCountByTheirAge) {
    for (const bool startedLast : {false, true}) {
        leave("1", "starting\n", startedLast ? 1h : 3h);
        leave("2", "working\n", startedLast ? 3h : 1h);
        leave("3", startedLast ? "working\n" : "starting\n", 5h);
        EXPECT_EQ(takeOrphanedMarks(list()),
                  startedLast ? StartPhase::starting : StartPhase::working);
        EXPECT_EQ(files(), 0u);
    }
    EXPECT_FALSE(takeOrphanedMarks(list()));
}

TEST_F(StartMarks, AreTakenForWorkIfTheyCannotBeRead) {
    std::filesystem::create_directory(folder.path() / "list.running-1");
    EXPECT_EQ(takeOrphanedMarks(list()), StartPhase::working);
    EXPECT_EQ(files(), 0u);
}

TEST_F(StartMarks, OfOtherListsAndOfHostsThatRunStay) {
    folder.write("other.running-1", "starting\n");
    folder.write("list", "");
    StartMark mark;
    EXPECT_TRUE(mark.leave(list()));
    EXPECT_FALSE(takeOrphanedMarks(list()));
    EXPECT_EQ(files(), 3u);
    mark.startIsOver();
    EXPECT_FALSE(takeOrphanedMarks(list()));
    mark.remove();
    EXPECT_EQ(files(), 2u);
}

} // namespace
