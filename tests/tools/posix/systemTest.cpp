// SPDX-License-Identifier: BSL-1.0
/// Tests the system's functions of the tools where a test from outside does not lead: standard
/// files that are closed, folders of the loader, and files that cannot be held.
#include "components/componentTools/platform/system.h"

#include "components/componentTools/platform/posix/inheritedNumber.h"
#include "components/platform/elfMachine.h"
#include "tests/support/testSystem.h"
#include "tests/tools/toolsFixture.h"

#include <algorithm>
#include <csignal>
#include <cstdlib>
#include <cstring>
#include <fcntl.h>
#include <optional>
#include <sys/resource.h>
#include <sys/time.h>
#include <sys/wait.h>
#include <unistd.h>

using namespace Mz;
using namespace Mz::Tools;
using namespace Mz::Test;

namespace {

/// The output and the exit status of a copy of this process.
struct Copy {
    int status = -1;
    std::string output;
};

/// Runs `work` in a copy of this process, whose standard output is a pipe.
template <class Work>
Copy inACopy(Work work) {
    int ends[2];
    if (::pipe2(ends, O_CLOEXEC) != 0)
        return {};
    const pid_t child = ::fork();
    if (child == 0) {
        ::dup2(ends[1], STDOUT_FILENO);
        ::_exit(work());
    }
    ::close(ends[1]);
    Copy result;
    char block[256];
    for (ssize_t got; (got = ::read(ends[0], block, sizeof block)) > 0;)
        result.output.append(block, static_cast<std::size_t>(got));
    ::close(ends[0]);
    int status = 0;
    if (::waitpid(child, &status, 0) == child && WIFEXITED(status))
        result.status = WEXITSTATUS(status);
    return result;
}

/// While it lives, this process may not open files beyond this number.
class FileLimit {
  public:
    explicit FileLimit(rlim_t count) {
        ::getrlimit(RLIMIT_NOFILE, &before);
        const rlimit limit{count, before.rlim_max};
        ::setrlimit(RLIMIT_NOFILE, &limit);
    }
    ~FileLimit() { ::setrlimit(RLIMIT_NOFILE, &before); }
    FileLimit(const FileLimit&) = delete;
    FileLimit& operator=(const FileLimit&) = delete;

  private:
    rlimit before{};
};

int writeText(int descriptor, const char* text) {
    return static_cast<int>(::write(descriptor, text, std::strlen(text)));
}

TEST(StandardFiles, CarryTheAnswersOfAProbeAlone) {
    const Copy copy = inACopy([] {
        System::AnswerPipe pipe;
        writeText(STDOUT_FILENO, "of the library");
        writeText(STDERR_FILENO, "of the library");
        pipe.write("answer", 6);
        return 5;
    });
    EXPECT_EQ(copy.output, "answer");
    EXPECT_EQ(copy.status, 5);
}

TEST(StandardFiles, CarryNoAnswerWhereNoFileCanBeOpened) {
    const Copy copy = inACopy([] {
        const FileLimit limit(STDERR_FILENO + 1);
        System::AnswerPipe pipe;
        pipe.write("answer", 6);
        return 5;
    });
    EXPECT_EQ(copy.output, "");
    EXPECT_EQ(copy.status, 5);
}

TEST(StandardFiles, AreReadThoughASignalInterrupts) {
    static int ends[2];
    const Copy copy = inACopy([] {
        struct sigaction action {};
        action.sa_handler = [](int) { writeText(ends[1], "late"); };
        if (::pipe2(ends, O_CLOEXEC) != 0 || ::sigaction(SIGALRM, &action, nullptr) != 0 ||
            ::dup2(ends[0], STDIN_FILENO) != STDIN_FILENO)
            return 1;
        System::InputPipe pipe;
        char next = 'x';
        if (::read(STDIN_FILENO, &next, 1) != 0) // Of the null device.
            return 2;
        const itimerval soon{{0, 0}, {0, 1000}};
        ::setitimer(ITIMER_REAL, &soon, nullptr);
        char text[8];
        return pipe.read(text, sizeof text) == 4 && std::memcmp(text, "late", 4) == 0 ? 5 : 3;
    });
    EXPECT_EQ(copy.status, 5);
}

TEST(StandardFiles, AreEmptyIfTheyAreClosed) {
    const Copy copy = inACopy([] {
        ::close(STDIN_FILENO);
        System::InputPipe pipe;
        char text[8];
        if (pipe.read(text, sizeof text) != 0)
            return 1;
        return ::fcntl(STDIN_FILENO, F_GETFD) >= 0 ? 5 : 2; // No other file gets its number.
    });
    EXPECT_EQ(copy.status, 5);
}

TEST(StandardFiles, OfOtherCodeGoNowhereIfThereIsNoStandardError) {
    const Copy copy = inACopy([] {
        ::close(STDERR_FILENO);
        const int reserved = System::reserveOutput();
        writeText(STDOUT_FILENO, "of other code");
        return System::writeReserved(reserved, "own", 3) ? 5 : 1;
    });
    EXPECT_EQ(copy.output, "own");
    EXPECT_EQ(copy.status, 5);
    const Copy closed = inACopy([] {
        ::close(STDOUT_FILENO);
        ::close(STDERR_FILENO);
        const int reserved = System::reserveOutput();
        if (writeText(STDOUT_FILENO, "of other code") <= 0)
            return 1;
        return reserved == -1 && !System::writeReserved(reserved, "own", 3) ? 5 : 2;
    });
    EXPECT_EQ(closed.status, 5);
}

TEST(StandardFiles, CannotBeWrittenOnAFullDevice) {
    const int full = ::open("/dev/full", O_WRONLY | O_CLOEXEC);
    ASSERT_GE(full, 0);
    EXPECT_FALSE(System::writeReserved(full, "own", 3));
    EXPECT_TRUE(System::writeReserved(full, "", 0));
    ::close(full);
}

TEST(InheritedFile, IsTakenByItsNumberAlone) {
    const TemporaryDirectory folder;
    const std::filesystem::path file = folder.write("file", "content");
    const Copy copy = inACopy([&] {
        const System::InheritableFile opened(file);
        ::dup2(static_cast<int>(opened.number()), System::inheritedNumber);
        std::ifstream stream;
        for (const char* other : {"", "x", "4"})
            if (System::takeInheritedFile(other, stream))
                return 1;
        std::string text;
        if (!System::takeInheritedFile(opened.argument(), stream) || !(stream >> text))
            return 2;
        stream.close();
        ::close(System::inheritedNumber);
        std::ifstream none;
        return text == "content" && !System::takeInheritedFile(opened.argument(), none) ? 5 : 3;
    });
    EXPECT_EQ(copy.status, 5);
}

TEST(BlockedSignals, LeaveThoseBlockedThatWereSo) {
    sigset_t first, now;
    ::sigemptyset(&first);
    ::sigaddset(&first, SIGUSR1);
    ::sigaddset(&first, SIGRTMIN);
    ASSERT_EQ(::pthread_sigmask(SIG_BLOCK, &first, nullptr), 0);
    const auto isBlocked = [&](int number) {
        ::pthread_sigmask(SIG_SETMASK, nullptr, &now);
        return ::sigismember(&now, number) == 1;
    };
    {
        const System::BlockedSignals blocked;
        EXPECT_TRUE(isBlocked(SIGUSR1) && isBlocked(SIGUSR2) && isBlocked(SIGRTMIN));
        EXPECT_FALSE(isBlocked(SIGSEGV));
    }
    EXPECT_TRUE(isBlocked(SIGUSR1) && isBlocked(SIGRTMIN));
    EXPECT_FALSE(isBlocked(SIGUSR2) || isBlocked(SIGSEGV));
    ::pthread_sigmask(SIG_UNBLOCK, &first, nullptr);
}

class LoaderFolders : public testing::Test {
  protected:
    ~LoaderFolders() override { set(before); }

    /// Searches with this content of LD_LIBRARY_PATH.
    System::Located find(const std::string& name, const std::optional<std::string>& list) const {
        set(list);
        return System::findDependency(name, {folder.path() / "needer", {}}, {});
    }

    static void set(const std::optional<std::string>& list) {
        if (list)
            ::setenv("LD_LIBRARY_PATH", list->c_str(), 1);
        else
            ::unsetenv("LD_LIBRARY_PATH");
    }

    static std::optional<std::string> current() {
        const char* const list = std::getenv("LD_LIBRARY_PATH");
        return list ? std::optional<std::string>(list) : std::nullopt;
    }

    const std::optional<std::string> before = current();
    TemporaryDirectory folder, other;
};

TEST_F(LoaderFolders, AreThoseOfTheEnvironment) {
    const std::filesystem::path file = folder.write("dependency", "");
    const std::string wanted = folder.path().string();
    EXPECT_FALSE(find("dependency", std::nullopt).found);
    for (const std::string& list :
         {wanted, "/absent:" + wanted, "/absent;" + wanted + ";/other", wanted + ":",
          std::string("$ORIGIN"), std::string("/absent:${ORIGIN}")}) {
        const System::Located located = find("dependency", list);
        EXPECT_TRUE(located.found) << list;
        EXPECT_EQ(located.file, file) << list;
    }
    EXPECT_FALSE(find("dependency", other.path().string()).found);
    EXPECT_FALSE(find("absent", wanted).found);
}

TEST_F(LoaderFolders, IncludeTheCurrentOneIfAnEntryOfTheListIsEmpty) {
    folder.write("dependency", "");
    const std::filesystem::path start = std::filesystem::current_path();
    std::filesystem::current_path(folder.path());
    for (const char* list : {":/absent", "/absent::/other"})
        EXPECT_EQ(find("dependency", list).file, "./dependency") << list;
    EXPECT_FALSE(find("dependency", "").found);
    std::filesystem::current_path(start);
}

TEST_F(LoaderFolders, IncludeThoseOfTheSystem) {
    const std::filesystem::path system =
        std::filesystem::path("/usr/lib") / platform::multiarchFolder;
    // The loader's cache names libraries alone.
    std::error_code failure;
    for (const auto& entry : std::filesystem::directory_iterator(system, failure)) {
        const std::string name = entry.path().filename().string();
        if (!entry.is_regular_file() || name.find(".so") != std::string::npos)
            continue;
        const System::Located located = find(name, std::nullopt);
        EXPECT_TRUE(located.found) << name;
        EXPECT_TRUE(std::filesystem::equivalent(located.file, entry.path())) << name;
        return;
    }
    GTEST_SKIP() << "the system has no such file";
}

TEST(LoaderError, IsNoneOfALibraryThatLoadsTheSecondTime) {
    EXPECT_EQ(System::loaderError(builtComponent(L"goodWithKit")),
              L"it loads at the second attempt");
    EXPECT_TRUE(System::loaderError("/absent/library").starts_with(L"/absent/library: "));
}

TEST(Arguments, LackTheProgramIfThereIsOne) {
    char program[] = "program", first[] = "first";
    char* values[] = {program, first, nullptr};
    EXPECT_THAT(System::arguments(2, values), testing::ElementsAre("first"));
    EXPECT_TRUE(System::arguments(1, values).empty());
    EXPECT_TRUE(System::arguments(0, values).empty());
}

class NormalisedFolder : public testing::Test {
  protected:
    std::optional<System::NativePath> find(const std::wstring& below) const {
        std::wstring name = folder.text() + below;
        std::replace(name.begin(), name.end(), L'/', L'\\');
        return System::findFolder(name);
    }

    TemporaryDirectory folder;
};

TEST_F(NormalisedFolder, IsFoundBySpellingOrByTheNameExceptForCase) {
    std::filesystem::create_directories(folder.path() / "Some" / "deep");
    EXPECT_EQ(find(L"/some/deep"), folder.path() / "Some" / "deep");
    EXPECT_EQ(find(L"/some//./deep/"), folder.path() / "Some" / "deep");
    std::filesystem::create_directory(folder.path() / "some");
    EXPECT_EQ(find(L"/some"), folder.path() / "some");
    EXPECT_EQ(find(L"/some/deep"), std::nullopt);
}

TEST_F(NormalisedFolder, IsNoFileAndNoNameThatCannotBe) {
    folder.write("FILE", "");
    folder.write("\xFF\xFE", "");
    EXPECT_EQ(find(L"/file"), std::nullopt);
    EXPECT_EQ(find(L"/absent/deeper"), std::nullopt);
    EXPECT_EQ(find(std::wstring(L"/") + static_cast<wchar_t>(0xD800)), std::nullopt);
}

TEST_F(NormalisedFolder, WithoutARootIsInTheCurrentOne) {
    const std::filesystem::path start = std::filesystem::current_path();
    std::filesystem::create_directory(folder.path() / "Some");
    std::filesystem::current_path(folder.path());
    EXPECT_EQ(System::findFolder(L"some"), "./Some");
    EXPECT_EQ(System::findFolder(L"."), ".");
    std::filesystem::current_path(start);
}

class HeldFile : public testing::Test {
  protected:
    std::filesystem::path path() const { return folder.path() / "held"; }

    std::size_t files() const {
        return static_cast<std::size_t>(
            std::distance(std::filesystem::directory_iterator(folder.path()), {}));
    }

    TemporaryDirectory folder;
};

TEST_F(HeldFile, IsNotCreatedInPlaceOfAFolder) {
    std::filesystem::create_directory(path());
    System::HeldFile file;
    EXPECT_FALSE(file.create(path()));
    EXPECT_EQ(files(), 1u); // Nothing is left of the attempt.
    EXPECT_FALSE(System::isHeld(path()));
    EXPECT_FALSE(System::isHeld(folder.path() / "absent"));
    EXPECT_FALSE(file.write("content"));
    file.remove();
    EXPECT_TRUE(std::filesystem::exists(path()));
}

TEST_F(HeldFile, ReportsThatItsContentCannotBeWritten) {
    System::HeldFile file;
    ASSERT_TRUE(file.create(path()));
    EXPECT_TRUE(System::isHeld(path()));
    ASSERT_TRUE(file.write("content"));
    rlimit before{};
    ::getrlimit(RLIMIT_FSIZE, &before);
    const rlimit small{3, before.rlim_max};
    const auto handler = std::signal(SIGXFSZ, SIG_IGN);
    ::setrlimit(RLIMIT_FSIZE, &small);
    const bool longer = file.write("other content"), shorter = file.write("now");
    ::setrlimit(RLIMIT_FSIZE, &before);
    std::signal(SIGXFSZ, handler);
    EXPECT_FALSE(longer);
    EXPECT_TRUE(shorter);
    EXPECT_EQ(contentOf(path()), "now");
}

} // namespace
