// SPDX-License-Identifier: BSL-1.0
/// Tests lists, replaced files and imports while calls of the system fail, transfer less than they
/// should, or are interrupted by signals.
#include "components/componentKit/hostKit.h"
#include "tests/kit/importers.h"
#include "tests/streams/components/recordedUids.h"
#include "tests/support/failingCalls.h"
#include "tests/support/fullMedium.h"
#include "tests/support/signalStorm.h"
#include "tests/support/temporaryDirectory.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <cerrno>
#include <fstream>
#include <iterator>

using namespace Mz;
using namespace Mz::Test;

namespace {

const std::filesystem::path components = std::filesystem::path(MZ_BUILD_PATH) / "components";

std::string contentOf(const std::filesystem::path& file) {
    std::ifstream in(file, std::ios::binary);
    return {std::istreambuf_iterator<char>(in), {}};
}

std::ptrdiff_t filesIn(const std::filesystem::path& folder) {
    return std::distance(std::filesystem::directory_iterator(folder), {});
}

class FilesWithFailingCalls : public testing::TestWithParam<int> {
  protected:
    TemporaryDirectory folder;
};

TEST_P(FilesWithFailingCalls, KeepAllOfTheOldListOrHaveAllOfTheNewOne) {
    Kit::initialize(components / "recordedLists");
    std::filesystem::create_directory(folder.path() / "sub");
    const auto list = folder.path() / "sub" / "list", link = folder.path() / "link";
    std::filesystem::create_symlink(list, link);
    Kit::writeList(list);
    const std::string whole = contentOf(list);
    constexpr auto permissions = std::filesystem::perms(0600);
    const int failures = failEachCall(GetParam(), [&](CallAttempt& attempt) {
        std::ofstream(list, std::ios::binary) << "the old one";
        std::filesystem::permissions(list, permissions);
        const std::string problem = attempt.run([&]() -> std::string {
            try {
                Kit::writeList(link);
            } catch (const QrStreamEx& failure) { // ExWriteOpen and ExWriteError
                return failure.getReason();
            }
            return {};
        });
        EXPECT_EQ(contentOf(list), problem.empty() ? whole : "the old one") << attempt.failed;
        if (!problem.empty()) {
            EXPECT_THAT(problem, testing::HasSubstr(link.string()));
        }
        EXPECT_EQ(std::filesystem::status(list).permissions(), permissions) << attempt.failed;
        EXPECT_TRUE(std::filesystem::is_symlink(link)) << attempt.failed;
        EXPECT_EQ(filesIn(list.parent_path()), 1) << attempt.failed;
    });
    EXPECT_GE(failures, 8);
}

TEST_P(FilesWithFailingCalls, AreReadWhollyOrTheListHasAProblem) {
    // One library without builders.
    const std::string content =
        std::string("\0\0\0\1\0\0\0\3/no\0\0\0\4file", 19) + std::string(16, '\0');
    const auto list = folder.write("list", content);
    ASSERT_TRUE(Kit::readList(list));
    failEachCall(GetParam(), [&](CallAttempt& attempt) {
        const Kit::ListReading result = attempt.run([&] { return Kit::readList(list); });
        EXPECT_TRUE(result.found) << attempt.failed;
        EXPECT_TRUE(Kit::readList(list));
    });
}

TEST_P(FilesWithFailingCalls, AreImportedWhollyOrNotAtAll) {
    Kit::initialize(components / "kitImporters");
    const auto file = folder.write("input.a", "B=take");
    const std::wstring name = file.wstring();
    const auto importer = Kit::newImporter<L"script">();
    bool found = false;
    // So that the libraries are loaded.
    ASSERT_TRUE(importer->import(name.c_str(), nullptr, found));
    const int failures = failEachCall(GetParam(), [&](CallAttempt& attempt) {
        const bool imported = attempt.run([&] {
            try {
                return bool(importer->import(name.c_str(), nullptr, found));
            } catch (const QrStreamEx::ExReadError&) {
                return false;
            }
        });
        EXPECT_TRUE(imported || !attempt.failed.empty());
        EXPECT_TRUE(importer->import(name.c_str(), nullptr, found)) << attempt.failed;
    });
    EXPECT_GE(failures, 4);
}

// The builder takes what it could read of an input for the whole, so it must not get a part.
TEST_P(FilesWithFailingCalls, AreNeverReadInPartUnderAPolicy) {
    Kit::initialize(components / "kitImporters");
    const auto file = folder.write("input.a", "A=take");
    const auto import = [&] { return Kit::importFile(L"script", file); };
    ASSERT_TRUE(import()); // So that the libraries are loaded.
    int refused = 0;
    const int failures = failEachCall(GetParam(), [&](CallAttempt& attempt) {
        const Kit::ImportResult result = attempt.run(import);
        EXPECT_TRUE(result || !attempt.failed.empty());
        refused += attempt.failed == "read" && !result ? 1 : 0;
        EXPECT_TRUE(import()) << attempt.failed;
    });
    EXPECT_GE(failures, 4);
    // When it is asked and when it imports, one call reads the input and another one its end. The
    // builder ignores failures after that.
    EXPECT_EQ(refused, GetParam() == EINTR ? 0 : 4);
}

INSTANTIATE_TEST_SUITE_P(, FilesWithFailingCalls,
                         testing::Values(EIO, EINTR, EMFILE, ENOMEM, ENOSPC));

TEST(FilesOnAFullMedium, KeepTheOldList) {
    TemporaryDirectory folder;
    Kit::initialize(components / "recordedLists");
    const auto list = folder.path() / "list";
    Kit::writeList(list);
    const auto size = std::filesystem::file_size(list);
    std::ofstream(list, std::ios::binary) << "the old one";
    for (std::uintmax_t room = 0; room < size; ++room) {
        const FullMedium full(room);
        EXPECT_THROW(Kit::writeList(list), QrStreamEx::ExWriteError) << room;
        EXPECT_EQ(contentOf(list), "the old one");
        EXPECT_EQ(filesIn(folder.path()), 1);
    }
    Kit::writeList(list);
    EXPECT_EQ(std::filesystem::file_size(list), size);
}

TEST(FilesUnderSignals, AreTheSame) {
    TemporaryDirectory folder;
    Kit::initialize(components / "kitImporters");
    const auto list = folder.path() / "list", other = folder.path() / "other";
    const auto input = folder.write("input.a", "B=take");
    Kit::writeList(list);
    const auto importer = Kit::newImporter<L"script">();
    bool found = false;
    underSignals(100, [&] {
        Kit::writeList(other);
        EXPECT_EQ(contentOf(other), contentOf(list));
        EXPECT_TRUE(importer->import(input.wstring().c_str(), nullptr, found));
    });
}

TEST(FilesWithShortTransfers, AreTheSame) {
    TemporaryDirectory folder;
    Kit::initialize(components / "recordedLists");
    const auto list = folder.path() / "list", other = folder.path() / "other";
    Kit::writeList(list);
    const ShortTransfers shortened;
    Kit::writeList(other);
    EXPECT_EQ(contentOf(other), contentOf(list));
}

} // namespace
