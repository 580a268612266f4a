// SPDX-License-Identifier: BSL-1.0
/// Tests imports, and the functions of the host kit, while allocations fail.
#include "components/componentKit/hostKit.h"
#include "tests/kit/importers.h"
#include "tests/streams/components/recordedUids.h"
#include "tests/support/failingAllocations.h"
#include "tests/support/temporaryDirectory.h"
#include "tests/support/testSystem.h"
#include "tests/unit/openFiles.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <filesystem>
#include <fstream>
#include <iterator>
#include <string>

using namespace Mz;
using namespace Mz::Test;

namespace {

const std::filesystem::path components = std::filesystem::path(MZ_BUILD_PATH) / "components";

/// Shows nothing, since a stream swallows a failed allocation.
class Silent final : public Kit::Controller {
    void show(Kind, const wchar_t*) override {}
};

std::wstring wordsOf(const QrRef<QrCastable>& object) {
    const QrPtr<Words> words = queryCast<Words>(object.get());
    return words ? words->words() : L"(none)";
}

class ImportWithoutMemory : public testing::Test {
  protected:
    ImportWithoutMemory() { Kit::initialize(components / "kitImporters"); }

    Silent controller;
    const Kit::ControllerScope installed{controller};
    TemporaryDirectory folder;
};

TEST_F(ImportWithoutMemory, GivesTheObjectInTheNextCallAndLeavesNoFileOpen) {
    const std::filesystem::path file = folder.write("input.a", "B=take");
    const std::wstring name = file.wstring();
    const auto importer = Kit::newImporter<L"script">();
    // The test builder catches no bad_alloc, so none is taken for a builder that declines.
    const int failures = failEachAllocation([&](Attempt& attempt) {
        QrRef<QrCastable> object;
        bool found = false;
        const bool done =
            attempt.run([&] { object = importer->import(name.c_str(), nullptr, found); });
        EXPECT_EQ(done, !attempt.failed);
        EXPECT_FALSE(isOpen(file));
        EXPECT_EQ(wordsOf(importer->import(name.c_str(), nullptr, found)), L"B");
    });
    EXPECT_GE(failures, leastFailures(10));
}

TEST_F(ImportWithoutMemory, ComposesTheFilterTextInTheNextCall) {
    const std::wstring types = Kit::newImporter<L"script">()->getFileTypes();
    EXPECT_FALSE(types.empty());
    failEachAllocation([&](Attempt& attempt) {
        const auto importer = Kit::newImporter<L"script">();
        EXPECT_TRUE(attempt.throwsOnFailure([&] { importer->getFileTypes(); }));
        EXPECT_EQ(importer->getFileTypes(), types);
    });
}

/// Under a policy, a builder that throws declines or fails, and the result says so. A failure
/// outside of builders passes to the caller.
TEST_F(ImportWithoutMemory, UnderAPolicyReportsTheBuilderOrThrows) {
    const std::filesystem::path file = folder.write("input.a", "A=find input.a;B=take");
    const int failures = failEachAllocation([&](Attempt& attempt) {
        Kit::ImportResult result;
        if (attempt.run([&] { result = Kit::importFile(L"script", file); })) {
            EXPECT_EQ(result.end == Kit::ImportEnd::imported, bool(result.object));
            if (attempt.failed && !result.object) {
                EXPECT_NE(result.decider(), nullptr);
            }
        }
        EXPECT_EQ(QrGetProcessController(), &controller);
        EXPECT_FALSE(isOpen(file));
        EXPECT_TRUE(Kit::importFile(L"script", file));
    });
    EXPECT_GE(failures, leastFailures(20));
}

TEST(ControllerWithoutMemory, FindsTheFileInTheNextCall) {
    TemporaryDirectory folder;
    folder.write("a file with a name of its own.txt", "x");
    const std::wstring search = folder.text() + L"/nowhere;" + folder.text();
    Silent controller;
    failEachAllocation([&](Attempt& attempt) {
        std::wstring found;
        const auto find = [&] {
            found =
                controller.findFile(L"a file with a name of its own.txt", search.c_str(), nullptr);
        };
        EXPECT_TRUE(attempt.throwsOnFailure(find));
        find();
        EXPECT_FALSE(found.empty());
    });
}

std::string contentOf(const std::filesystem::path& file) {
    std::ifstream in(file, std::ios::binary);
    return {std::istreambuf_iterator<char>(in), {}};
}

std::ptrdiff_t filesIn(const std::filesystem::path& folder) {
    return std::distance(std::filesystem::directory_iterator(folder), {});
}

TEST(ListWithoutMemory, IsReplacedWhollyOrKept) {
    TemporaryDirectory folder;
    Kit::initialize(components / "recordedLists");
    const std::filesystem::path list = folder.path() / "the list", other = folder.path() / "other";
    Kit::writeList(other);
    const std::string whole = contentOf(other);
    const int failures = failEachAllocation([&](Attempt& attempt) {
        folder.write("the list", "the old one");
        bool refused = false;
        const bool done = attempt.run([&] {
            try {
                Kit::writeList(list);
            } catch (const QrStreamEx::ExWriteError&) { // A file stream that lacks its buffer.
                refused = true;
            }
        });
        EXPECT_EQ(contentOf(list), done && !refused ? whole : "the old one");
        EXPECT_EQ(filesIn(folder.path()), 2);
        EXPECT_FALSE(isOpen(list));
        EXPECT_TRUE(attempt.failed || done);
    });
    EXPECT_GE(failures, leastFailures(8));
    Kit::writeList(list);
    EXPECT_EQ(contentOf(list), whole);
}

TEST(ListWithoutMemory, IsReadOrReportedOrThrows) {
    TemporaryDirectory folder;
    // One library without builders.
    const std::string list =
        std::string("\0\0\0\1\0\0\0\3/no\0\0\0\4file", 19) + std::string(16, '\0');
    const std::filesystem::path file = folder.write("list", list);
    ASSERT_TRUE(Kit::readList(file));
    failEachAllocation([&](Attempt& attempt) {
        Kit::ListReading result;
        if (attempt.run([&] { result = Kit::readList(file); })) {
            EXPECT_EQ(bool(result), !attempt.failed);
            EXPECT_TRUE(result.found);
        }
        EXPECT_FALSE(isOpen(file));
        EXPECT_TRUE(Kit::readList(file));
    });
}

TEST(KitWithoutMemory, InitialisesAndListsInTheNextCall) {
    const auto initialize = [] { Kit::initialize(components / "recordedLists"); };
    initialize();
    failEachAllocation([&](Attempt& attempt) {
        std::size_t count = 0;
        EXPECT_TRUE(attempt.throwsOnFailure([&] {
            initialize();
            count = Kit::builders().size();
            static_cast<void>(Kit::create<QrComponentBuilder>(recordedBeta));
        }));
        EXPECT_EQ(Kit::builders().size(), 3U);
        EXPECT_TRUE(Kit::create<QrComponentBuilder>(recordedBeta));
    });
}

} // namespace
