// SPDX-License-Identifier: BSL-1.0
// The kit's functions around the component manager of the process. A manager is initialised once,
// so each of these tests needs a process of its own, as ctest gives it one.
#include "components/componentKit/hostKit.h"
#include "tests/kit/shapes.h"
#include "tests/support/temporaryDirectory.h"
#include "tests/support/testSystem.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <fstream>
#include <iterator>
#include <ranges>
#include <sstream>

using namespace Mz;
using namespace Mz::Test;
using testing::ElementsAre;
using testing::HasSubstr;

namespace {

const std::filesystem::path component = std::filesystem::path(MZ_BUILD_PATH) / "components" /
                                        "kit" / (L"kitShapes" MZ_LIBRARY_EXTENSION);

std::string contentOf(const std::filesystem::path& file) {
    std::ifstream in(file, std::ios::binary);
    return {std::istreambuf_iterator<char>(in), {}};
}

class KitManager : public testing::Test {
  protected:
    KitManager() {
        EXPECT_TRUE(Kit::builders().empty()) << "Run each test in a process of its own.";
    }

    static void initialize() { Kit::initialize(component.parent_path()); }

    static std::vector<std::wstring> names() {
        std::vector<std::wstring> all;
        for (const QrCPtr<QrBuilderDescription>& builder : Kit::builders())
            all.emplace_back(builder->getName());
        return all;
    }

    /// Replaces the list by one that this start would write, changed by `change`, in a process of
    /// which the manager is not initialised.
    TemporaryDirectory folder;
    const std::filesystem::path list = folder.path() / "the list";
};

TEST_F(KitManager, CreatesObjectsAsAnInterface) {
    initialize();
    EXPECT_EQ(Kit::create<Shape>(squareUid)->corners(), 4);
    EXPECT_EQ(Kit::create<Coloured>(redSquareUid)->colour(), "red");
    EXPECT_EQ(Kit::create<Shape>(fiveUid)->corners(), 5);
    EXPECT_EQ(Kit::create<Shape>("4B7D1016-62AC-11EF-9E0B-3C5F8A21D7E4"_uid)->corners(), 6);
}

TEST_F(KitManager, CreatesNothingThatIsNotThere) {
    EXPECT_FALSE(Kit::create<Shape>(squareUid)) << "not initialised";
    initialize();
    EXPECT_FALSE(Kit::create<Shape>(QrUid{1, 2, 3, 4})) << "unknown";
    EXPECT_FALSE(Kit::create<Coloured>(squareUid)) << "not castable";
    EXPECT_FALSE(Kit::create<Shape>(countUid)) << "the builder makes no objects";
}

TEST_F(KitManager, TakesTheListFromTheEnvironment) {
    setEnvironment("MZ_COMPONENT_LIST", "");
    EXPECT_EQ(Kit::listFromEnvironment(list), list);
    const std::string other(300, 'x'); // Longer than the usual path on Windows.
    setEnvironment("MZ_COMPONENT_LIST", other);
    EXPECT_EQ(Kit::listFromEnvironment(list), other);
    setEnvironment("MZ_COMPONENT_LIST", "short");
    EXPECT_EQ(Kit::listFromEnvironment(list), "short");
}

TEST_F(KitManager, HasNoBuildersInAFolderThatIsNotThere) {
    Kit::initialize(folder.path() / "nowhere");
    EXPECT_TRUE(Kit::builders().empty());
}

TEST_F(KitManager, ListsTheBuilders) {
    initialize();
    EXPECT_THAT(names(),
                ElementsAre(L"shape", L"shape", L"shape", L"polygon", L"polygon", L"importer"));
    EXPECT_TRUE(Kit::builders().front()->getUid() == squareUid);
    const auto named = [](const auto& builder) {
        return builder->getName() == std::wstring_view(L"shape");
    };
    EXPECT_EQ(std::ranges::count_if(Kit::builders(), named), 3);
}

TEST_F(KitManager, CallsAFunctionForEachBuilder) {
    initialize();
    unsigned int sum = 0;
    EXPECT_EQ(Kit::forEachBuilder([&](const QrBuilderDescription& b) { sum += b.getNumber(); }),
              QrEnum::Continue);
    EXPECT_EQ(sum, 3U);

    int visited = 0;
    const auto stopAtSecond = [&](const QrBuilderDescription&) {
        return ++visited == 2 ? QrEnum::Fail : QrEnum::Continue;
    };
    EXPECT_EQ(Kit::forEachBuilder(stopAtSecond), QrEnum::Fail);
    EXPECT_EQ(visited, 2);
    EXPECT_THROW(Kit::forEachBuilder([](const QrBuilderDescription&) { throw 1; }), int);
}

TEST_F(KitManager, ImportsThroughTheBuildersOfAName) {
    initialize();
    const std::filesystem::path file = folder.write("seven.count", "7");
    bool found = false;
    const auto own = Kit::newImporter<L"shape">();
    EXPECT_STREQ(own->getFileTypes(), L"Counts|*.count|");
    const QrRef<QrCastable> object = own->import(file.wstring().c_str(), nullptr, found);
    ASSERT_TRUE(queryCast<Shape>(object.get()));
    EXPECT_EQ(queryCast<Shape>(object.get())->corners(), 7);

    const QrPtr<QrImporter> offered = Kit::create<QrImporter>(importerUid);
    ASSERT_TRUE(offered);
    EXPECT_TRUE(queryCast<Shape>(offered->import(file.wstring().c_str(), nullptr, found).get()));
    EXPECT_FALSE(Kit::newImporter<L"other">()->import(file.wstring().c_str(), nullptr));
}

// ---- The recorded list --------------------------------------------------------------------------

/// Writes the list in another process: this program again, as the test `Writer.WritesTheList`.
void writeListElsewhere(const std::filesystem::path& list) {
    setEnvironment("MZ_KIT_LIST", list.string());
    const std::filesystem::path self =
        std::filesystem::path(MZ_BUILD_PATH) / "bin" / (L"kitTests" MZ_PROGRAM_EXTENSION);
    const ProgramResult result = runProgram(
        self, "kitTests", {"--gtest_filter=KitListWriter.*", "--gtest_also_run_disabled_tests"},
        list.parent_path());
    EXPECT_TRUE(result.finished);
    ASSERT_EQ(result.exitCode, 0) << result.output;
}

/// Not a test, but the other process of `writeListElsewhere`.
TEST(KitListWriter, DISABLED_WritesTheList) {
    Kit::initialize(component.parent_path());
    Kit::writeList(std::getenv("MZ_KIT_LIST"));
}

TEST_F(KitManager, StartsWithAListWithoutLoading) {
    writeListElsewhere(list);
    const Kit::ListReading read = Kit::readList(list);
    EXPECT_TRUE(read);
    EXPECT_TRUE(read.found);
    EXPECT_EQ(read.problem, L"");
    initialize();
    EXPECT_EQ(names().size(), 6U);
    EXPECT_FALSE(isMapped(component));
    EXPECT_EQ(Kit::create<Shape>(squareUid)->corners(), 4);
    EXPECT_TRUE(isMapped(component));
}

TEST_F(KitManager, WritesTheSameListAfterAStartWithIt) {
    writeListElsewhere(list);
    ASSERT_TRUE(Kit::readList(list));
    initialize();
    const std::filesystem::path second = folder.path() / "second";
    Kit::writeList(second);
    EXPECT_EQ(contentOf(second), contentOf(list));
}

TEST_F(KitManager, SaysThatThereIsNoList) {
    const Kit::ListReading read = Kit::readList(list);
    EXPECT_FALSE(read);
    EXPECT_FALSE(read.found);
    EXPECT_EQ(read.problem, L"");
}

TEST_F(KitManager, ReportsWhatIsNoList) {
    const auto problemOf = [](const std::filesystem::path& file) {
        const Kit::ListReading read = Kit::readList(file);
        EXPECT_TRUE(read.found);
        EXPECT_FALSE(read);
        EXPECT_EQ(read.problem.find(displayName(file) + L": "), 0U) << toNarrow(read.problem, '?');
        EXPECT_EQ(read.problem.back(), L'.');
        return toNarrow(read.problem, '?');
    };
    EXPECT_THAT(problemOf(folder.path()), HasSubstr("cannot be opened"));
    EXPECT_THAT(problemOf(folder.write("empty", "")), HasSubstr("damaged"));
    EXPECT_THAT(problemOf(folder.write("text", "this is no list")), HasSubstr("damaged"));
    initialize();
    EXPECT_EQ(names().size(), 6U) << "The libraries are read as without a list.";
}

TEST_F(KitManager, KeepsWhatItReadBeforeTheDamage) {
    writeListElsewhere(list);
    // The second record is of a file that is not there, and cut off. The first stays.
    std::string bytes = contentOf(list);
    ASSERT_EQ(bytes.substr(0, 4), std::string("\0\0\0\1", 4));
    bytes[3] = 2;
    bytes.append("\0\0\0\7cut", 7);
    const Kit::ListReading read = Kit::readList(folder.write("damaged", bytes));
    EXPECT_TRUE(read.found);
    EXPECT_THAT(toNarrow(read.problem, '?'), HasSubstr("is damaged: Error reading stream."));
    initialize();
    EXPECT_EQ(names().size(), 6U);
    EXPECT_FALSE(isMapped(component));
}

TEST_F(KitManager, ReportsWhatFollowsAList) {
    writeListElsewhere(list);
    const Kit::ListReading read = Kit::readList(folder.write("long", contentOf(list) + "x"));
    EXPECT_THAT(toNarrow(read.problem, '?'), HasSubstr("more data follows its end"));
    initialize();
    EXPECT_FALSE(isMapped(component));
}

TEST_F(KitManager, ReadsNoListTooLate) {
    writeListElsewhere(list);
    initialize();
    EXPECT_THAT(toNarrow(Kit::readList(list).problem, '?'), HasSubstr("Read the list earlier."));
}

/// The reason with which the list was not written.
std::string refusal(const std::filesystem::path& list) {
    try {
        Kit::writeList(list);
    } catch (const QrStreamEx& failure) {
        return failure.getReason();
    }
    return "written";
}

TEST_F(KitManager, WritesNoListBeforeItIsInitialised) {
    folder.write("the list", "old");
    EXPECT_EQ(refusal(list), utf8Name(list) +
                                 ": the component manager is not initialised, so there is no list"
                                 ": Error writing stream.");
    EXPECT_EQ(contentOf(list), "old");
    EXPECT_EQ(std::distance(std::filesystem::directory_iterator(folder.path()), {}), 1);
}

TEST_F(KitManager, KeepsTheOldListIfTheLocaleCannotCarryTheNewOne) {
    // In the "C" locale a name beyond Latin-1 exists on Windows only; a label exists everywhere.
    std::filesystem::copy_file(component.parent_path().parent_path() / "kitForeign" /
                                   (L"kitForeign" MZ_LIBRARY_EXTENSION),
                               folder.path() / (L"foreign" MZ_LIBRARY_EXTENSION));
    folder.write("the list", "old");
    Kit::initialize(folder.path());
    ASSERT_EQ(names().size(), 1U);
    EXPECT_EQ(refusal(list), utf8Name(list) +
                                 ": the locale cannot represent a name or text of the list"
                                 ": Error writing stream.");
    EXPECT_EQ(contentOf(list), "old");
}

TEST_F(KitManager, WritesNoListWhereNoneCanBe) {
    initialize();
    EXPECT_THAT(refusal(folder.path() / "nowhere" / "list"), HasSubstr("nowhere"));
    EXPECT_THAT(refusal(folder.path()), HasSubstr("Error opening output stream"));
}

} // namespace
