// SPDX-License-Identifier: BSL-1.0
/// Tests scans that try several libraries at a time.
#include "tests/tools/toolsFixture.h"

#include "components/componentManager/castImpl.h"

#include <atomic>
#include <stdexcept>
#include <thread>
#include <utility>

using namespace Mz;
using namespace Mz::Tools;
using namespace Mz::Test;

namespace {

/// Notes the progress, and that no other thread than its own calls it.
class Listener final : public QrCastImpl<Listener, QrProcessControl> {
  public:
    void* getContext() override { return nullptr; }
    void message(int, const wchar_t*) override { noteThread(); }
    bool isInterrupted() override {
        noteThread();
        return false;
    }
    bool warning(int, const wchar_t*) override { return true; }
    bool isProgressShown() override {
        noteThread();
        return true;
    }
    bool progress(float done, const wchar_t* text) override {
        noteThread();
        steps.emplace_back(done, text);
        return true;
    }
    bool isStatusShown() override { return false; }
    void status(const wchar_t*) override { noteThread(); }
    bool error(int, const wchar_t*) override { return false; }
    bool isErrorShown() override { return false; }
    void log(int, const wchar_t*) override { noteThread(); }
    [[noreturn]] void abort(int, const wchar_t*) override { throw 1; }
    std::wstring findFile(const wchar_t*, const wchar_t*, const wchar_t*) override { return {}; }

    std::vector<std::pair<float, std::wstring>> steps;
    std::atomic<bool> isForeign{false}; ///< whether another thread called
  private:
    void noteThread() {
        if (std::this_thread::get_id() != own)
            isForeign = true;
    }
    const std::thread::id own = std::this_thread::get_id();
};

bool areEqual(const ScannedFile& a, const ScannedFile& b) {
    return a.path == b.path && a.directory == b.directory && a.fileName == b.fileName &&
           a.verdict == b.verdict && a.notes == b.notes && a.recorded == b.recorded &&
           a.looked == b.looked && a.folder == b.folder;
}

class ScanJobs : public ToolsTest {
  protected:
    ScanOptions options(std::size_t jobs) const {
        ScanOptions wanted;
        wanted.folders = {folder.path()};
        wanted.probe = patient();
        wanted.jobs = jobs;
        return wanted;
    }

    void addNumbered(int count) {
        for (int number = 10; number < 10 + count; ++number) {
            const auto file = builtComponent(L"numbered" + std::to_wstring(number), L"numbered");
            std::filesystem::copy_file(file, folder.path() / file.filename());
        }
    }

    void addHostile() {
        addNumbered(12);
        for (const wchar_t* name :
             {L"crashesInInitialiser", L"crashesInEnumerate", L"aborts", L"exits", L"loopsForever",
              L"missesDependency", L"noEntryPoint", L"nullDescription", L"throwsInEntryPoint",
              L"offersNull", L"nilUid"})
            add(name);
        add(L"goodWithKit", "again");
        add(L"goodWithKit", "andAgain"); // The same uid.
        folder.write("text.txt", "no library");
    }

    std::filesystem::path listOf(std::size_t jobs) const {
        return lists.path() / ("list" + std::to_string(jobs));
    }

    ScanResult scanHostile(std::size_t jobs, Listener& listener) const {
        ScanOptions wanted = options(jobs);
        wanted.list = listOf(jobs);
        wanted.probe.timeLimit = std::chrono::seconds(10);
        wanted.controller = &listener;
        return scan(wanted);
    }

    TemporaryDirectory lists;
};

TEST_F(ScanJobs, ReportAndRecordTheSameAsOne) {
    addHostile();
    Listener alone, together;
    const ScanResult one = scanHostile(1, alone);
    const ScanResult four = scanHostile(4, together);
    EXPECT_EQ(contentOf(listOf(4)), contentOf(listOf(1)));
    EXPECT_EQ(contentOf(verdictsFileOf(listOf(4))), contentOf(verdictsFileOf(listOf(1))));
    ASSERT_EQ(four.files.size(), one.files.size());
    for (std::size_t index = 0; index < one.files.size(); ++index)
        EXPECT_TRUE(areEqual(four.files[index], one.files[index])) << one.files[index].path;
    EXPECT_EQ(together.steps, alone.steps);
    EXPECT_EQ(alone.steps.size(), one.files.size());
    EXPECT_FALSE(together.isForeign);
}

TEST_F(ScanJobs, LeaveTheTimeOfEachLibraryAsItIs) {
    add(L"loopsForever", "aaa");
    add(L"loopsForever", "bbb");
    addNumbered(2); // They wait for the others longer than they may take.
    ScanOptions wanted = options(2);
    wanted.probe.timeLimit = std::chrono::seconds(5);
    const ScanResult result = scan(wanted);
    ASSERT_EQ(result.files.size(), 4u);
    EXPECT_EQ(result.files[0].verdict.verdict, Verdict::timedOut);
    EXPECT_EQ(result.files[1].verdict.verdict, Verdict::timedOut);
    EXPECT_EQ(result.files[2].verdict.verdict, Verdict::works);
    EXPECT_EQ(result.files[3].verdict.verdict, Verdict::works);
}

TEST_F(ScanJobs, GoOnBesideALibraryThatHangs) {
    // It is the first one. With one job, no other would be tried within the limit of time.
    add(L"loopsForever", "aaa");
    addNumbered(4);
    ScanOptions wanted = options(2);
    wanted.list = listOf(2);
    wanted.probe.timeLimit = std::chrono::hours(1);
    const auto begin = std::chrono::steady_clock::now();
    wanted.probe.interrupted = [&] {
        return std::chrono::steady_clock::now() - begin > std::chrono::seconds(8);
    };
    const ScanResult result = scan(wanted);
    EXPECT_TRUE(result.interrupted);
    ASSERT_EQ(result.files.size(), 5u);
    EXPECT_EQ(result.files[0].verdict.verdict, Verdict::interrupted);
    for (std::size_t index = 1; index < result.files.size(); ++index)
        EXPECT_EQ(result.files[index].verdict.verdict, Verdict::works);
    EXPECT_EQ(readRecordedList(listOf(2)).libraries.size(), 4u);
}

TEST_F(ScanJobs, EndWhenACallbackThrows) {
    for (const char* name : {"one", "two", "three", "four", "five"})
        add(L"loopsForever", name);
    ScanOptions wanted = options(3);
    wanted.probe.timeLimit = std::chrono::hours(1);
    int asked = 0;
    const std::thread::id own = std::this_thread::get_id();
    bool isForeign = false;
    wanted.probe.interrupted = [&]() -> bool {
        isForeign = isForeign || std::this_thread::get_id() != own;
        if (++asked < 20)
            return false;
        throw std::runtime_error("the callback");
    };
    EXPECT_THROW(scan(wanted), std::runtime_error);
    EXPECT_EQ(asked, 20);
    EXPECT_FALSE(isForeign);
    EXPECT_FALSE(hasChildProcess());
}

TEST_F(ScanJobs, MayBeMoreThanThereAreLibraries) {
    addNumbered(2);
    EXPECT_EQ(scan(options(1'000'000)).libraries.size(), 2u);
}

} // namespace
