// SPDX-License-Identifier: BSL-1.0
/// Tests the tools while calls of the system fail: the verdict is true or says that the file could
/// not be read or tried, and no list loses a record.
#include "components/componentTools/disabled.h"
#include "tests/support/failingCalls.h"
#include "tests/support/fullMedium.h"
#include "tests/support/signalStorm.h"
#include "tests/tools/toolsFixture.h"

#include <algorithm>
#include <cerrno>
#include <sys/wait.h>
#include <unistd.h>

using namespace Mz;
using namespace Mz::Tools;
using namespace Mz::Test;
using ::testing::AnyOf;

namespace {

/// A folder with two components, of which one is switched off, and the list of a scan.
class ToolsWithAList : public ToolsTest {
  protected:
    ToolsWithAList() {
        scanned();
        EXPECT_TRUE(disableComponent(counted, list, L"too slow").changed);
        scanned(); // Compares anew, and leaves a digest of that.
        wholeList = contentOf(list);
        wholeVerdicts = contentOf(verdictsFileOf(list));
    }

    ScanResult scanned() const {
        ScanOptions wanted;
        wanted.folders = {folder.path()};
        wanted.list = list;
        wanted.probe = patient();
        return scan(wanted);
    }

    TemporaryDirectory lists;
    const std::filesystem::path list = lists.path() / "list";
    const std::filesystem::path good = add(L"goodWithKit"), counted = add(L"countedDescription");
    std::string wholeList, wholeVerdicts;
};

class ToolsWithFailingCalls : public ToolsWithAList, public ::testing::WithParamInterface<int> {};
using ToolsOnAFullMedium = ToolsWithAList;

TEST_P(ToolsWithFailingCalls, ExplainTheFileOrSayThatItCannotBeRead) {
    ExplainOptions options;
    options.followDependencies = false;
    const int failures = failEachCall(GetParam(), [&](CallAttempt& attempt) {
        const Verdict verdict = attempt.run([&] {
            try {
                return explainFile(good, options).verdict.verdict;
            } catch (const std::system_error&) { // The folder of the program is not known.
                return Verdict::unreadable;
            }
        });
        EXPECT_THAT(verdict, AnyOf(Verdict::component, Verdict::unreadable)) << attempt.failed;
        EXPECT_EQ(explainFile(good, options).verdict.verdict, Verdict::component);
    });
    EXPECT_GE(failures, 4);
}

TEST_P(ToolsWithFailingCalls, ReadTheListOrReject) {
    failEachCall(GetParam(), [&](CallAttempt& attempt) {
        const ListReading reading = attempt.run([&] { return readRecordedList(list); });
        EXPECT_NE(reading.state, ListReading::State::missing) << attempt.failed;
        EXPECT_EQ(reading.reason.empty(), reading.state == ListReading::State::good)
            << attempt.failed;
        EXPECT_EQ(readRecordedList(list).libraries.size(), 2U);
    });
}

TEST_P(ToolsWithFailingCalls, ScanWithoutSwitchingAnythingOn) {
    const int failures = failEachCall(GetParam(), [&](CallAttempt& attempt) {
        attempt.run([&] {
            try {
                scanned();
            } catch (const std::system_error&) { // The folder of the program is not known.
            }
            return 0;
        });
        EXPECT_EQ(disabledComponents(list).size(), 1U) << attempt.failed;
        const ListReading reading = readRecordedList(list);
        EXPECT_EQ(reading.libraries.size(), 2U) << attempt.failed;
        for (const RecordedLibrary& library : reading.libraries)
            EXPECT_EQ(library.builders.empty(), library.fileName.starts_with(L"counted"))
                << attempt.failed;
        // The next scan has what it had.
        EXPECT_EQ(scanned().notWritten, L"");
        EXPECT_EQ(contentOf(list), wholeList) << attempt.failed;
        EXPECT_EQ(contentOf(verdictsFileOf(list)), wholeVerdicts) << attempt.failed;
        std::filesystem::remove(lists.path() / "list.rejected");
    });
    EXPECT_GE(failures, 20);
}

TEST_P(ToolsWithFailingCalls, TryALibraryOrSayThatTheProcessFailed) {
    const int failures = failEachCall(GetParam(), [&](CallAttempt& attempt) {
        ::testing::internal::CaptureStdout();
        const Finding finding = attempt.run([&] { return probeLibrary(good, patient()).verdict; });
        EXPECT_EQ(::testing::internal::GetCapturedStdout(), "") << attempt.failed;
        EXPECT_THAT(finding.verdict, AnyOf(Verdict::works, Verdict::probeFailed)) << attempt.failed;
        EXPECT_FALSE(hasChildProcess());
    });
    EXPECT_GE(failures, 4);
}

INSTANTIATE_TEST_SUITE_P(, ToolsWithFailingCalls, ::testing::Values(EIO, EINTR, EMFILE, ENOMEM));

TEST_F(ToolsOnAFullMedium, KeepWhatIsThere) {
    std::filesystem::remove(list);
    for (const std::size_t room : {std::size_t{0}, std::size_t{1}, wholeList.size() - 1}) {
        const FullMedium full(room);
        EXPECT_NE(scanned().notWritten, L"") << room;
        EXPECT_FALSE(std::filesystem::exists(list));
        EXPECT_EQ(contentOf(verdictsFileOf(list)), wholeVerdicts);
    }
    const FullMedium full(wholeList.size());
    EXPECT_EQ(scanned().notWritten, L"") << "the other file is unchanged";
    EXPECT_EQ(contentOf(list), wholeList);
}

using ToolsUnderSignals = ToolsTest;

TEST_F(ToolsUnderSignals, TryALibrary) {
    const auto good = add(L"goodWithKit");
    underSignals(100,
                 [&] { EXPECT_EQ(probeLibrary(good, patient()).verdict.verdict, Verdict::works); });
}

using ToolsWithoutStandardFiles = ToolsTest;

TEST_F(ToolsWithoutStandardFiles, TryALibrary) {
    const auto good = add(L"goodWithKit");
    // Each combination of closed standard files.
    for (int closed = 1; closed < 8; ++closed) {
        const pid_t child = ::fork();
        if (child == 0) {
            for (int file = 0; file < 3; ++file)
                if (closed & 1 << file)
                    ::close(file);
            const Verdict verdict = probeLibrary(good, patient()).verdict.verdict;
            ::_exit(verdict == Verdict::works ? 0 : 1);
        }
        int status = -1;
        ASSERT_EQ(::waitpid(child, &status, 0), child);
        EXPECT_EQ(status, 0) << closed;
    }
}

} // namespace
