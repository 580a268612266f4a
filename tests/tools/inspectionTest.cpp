// SPDX-License-Identifier: BSL-1.0
/// Verdicts that need a library of the other system, what a library needs of its host, and notes on
/// colliding uids.
#include "tests/tools/images.h"

#include "components/componentManager/nativeText.h"
#include "components/componentTools/inspecting/hostNeeds.h"
#include "components/componentTools/inspecting/inspection.h"
#include "components/componentTools/inspecting/uidNotes.h"
#include "components/componentTools/platform/system.h"
#include "components/componentTools/uidText.h"
#include "tests/support/temporaryDirectory.h"

#include <gtest/gtest.h>

#include <filesystem>
#include <string>
#include <vector>

using namespace Mz;
using namespace Mz::Tools;
using namespace Mz::Test;

namespace {

TEST(Inspection, NamesTheSystemOfALibraryForAnother) {
    const bool elf = System::ownFormat() == ImageFormat::elf;
    const TemporaryDirectory folder;
    LibraryImage image;
    const Finding finding =
        inspectFile(folder.write("image", elf ? peLibrary({}) : elfLibrary({})), image);
    EXPECT_EQ(finding.verdict, Verdict::otherSystem);
    EXPECT_EQ(finding.subject, elf ? L"Windows" : L"Linux");
}

TEST(Inspection, TakesAnObjectFileForNoLibrary) {
    const TemporaryDirectory folder;
    std::string content = elfLibrary({});
    content[16] = 1; // Not linked yet.
    LibraryImage image;
    const Finding finding = inspectFile(folder.write("image", content), image);
    EXPECT_EQ(finding.verdict, Verdict::notALibrary);
    EXPECT_EQ(image.kind, LibraryImage::Kind::other);
}

/// A library that is described here. Nothing reads its file.
class Dependencies : public ::testing::Test {
  protected:
    std::vector<Dependency> found() const {
        return dependenciesOf(folder.path() / "library", image, folder.path());
    }

    const TemporaryDirectory folder;
    LibraryImage image;
};

TEST_F(Dependencies, OnItselfAreFound) {
    image.ownName = "self.lib";
    image.needed = {"self.lib", "missing.lib", "self.lib"};
    const std::vector<Dependency> all = found();
    ASSERT_EQ(all.size(), 2u) << "each name once";
    EXPECT_EQ(all[0].name, L"self.lib");
    EXPECT_TRUE(all[0].found);
    EXPECT_EQ(all[0].path, Mz::displayName(folder.path() / "library"));
    EXPECT_EQ(all[1].name, L"missing.lib");
    EXPECT_FALSE(all[1].found);
}

TEST_F(Dependencies, AreSearchedForNoMoreThanTwoThousandNames) {
    if (System::ownFormat() != ImageFormat::elf)
        GTEST_SKIP() << "to search the folders of the system so often takes seconds";
    for (int number = 0; number <= 2000; ++number)
        image.needed.push_back("missing" + std::to_string(number) + ".lib");
    EXPECT_EQ(found().size(), 2000u);
}

TEST_F(Dependencies, OfALibraryWithAManifestAreNotCalledMissing) {
    image.needed = {"missing.lib"};
    EXPECT_TRUE(missingDependency(folder.path() / "library", found()));
    image.hasManifest = true;
    EXPECT_FALSE(missingDependency(folder.path() / "library", found()));
}

TEST(ProgramOfHost, IsTheFirstProgramThatAWindowsLibraryImportsFrom) {
    LibraryImage image;
    image.format = ImageFormat::pe;
    const std::vector<Dependency> dependencies{
        {L"exe.dll", {}, {}, true}, {L"Host.EXE", {}, {}, true}, {L"other.exe", {}, {}, true}};
    const auto finding = programOfHost(image, dependencies);
    ASSERT_TRUE(finding);
    EXPECT_EQ(finding->verdict, Verdict::needsHost);
    EXPECT_EQ(finding->subject, L"Host.EXE");
    EXPECT_EQ(finding->words, L"");
    EXPECT_FALSE(programOfHost(image, {{L"exe.dll", {}, {}, true}}));
    image.format = ImageFormat::elf;
    EXPECT_FALSE(programOfHost(image, dependencies));
}

TEST(SymbolOfHost, IsOneThatNoLibraryDefinesIfAllCanBeSearched) {
    const auto built = [](const std::wstring& name) {
        return std::filesystem::path(MZ_BUILD_PATH) / "components" / name /
               (name + MZ_LIBRARY_EXTENSION);
    };
    const std::filesystem::path file = built(L"takesFromHost");
    const LibraryImage image = readLibraryImage(file);
    std::vector<Dependency> dependencies = dependenciesOf(file, image, {});
    const auto finding = symbolOfHost(file, dependencies);
    if (image.format == ImageFormat::elf) {
        ASSERT_TRUE(finding);
        EXPECT_EQ(finding->verdict, Verdict::needsHost);
        EXPECT_EQ(finding->subject, L"mzTestHostNumber");
        EXPECT_EQ(finding->words, L", a symbol that no library it needs defines");
    } else {
        EXPECT_FALSE(finding) << "such libraries name the program";
    }
    const TemporaryDirectory folder;
    dependencies.push_back(
        {L"text", {}, Mz::displayName(folder.write("text", "no library")), true});
    EXPECT_FALSE(symbolOfHost(file, dependencies));
    dependencies.back().path = L"a name that no file has: \xD800";
    EXPECT_FALSE(symbolOfHost(file, dependencies));
    dependencies.back().path.clear();
    EXPECT_FALSE(symbolOfHost(file, dependencies));
    const std::filesystem::path sound = built(L"goodWithKit");
    EXPECT_FALSE(symbolOfHost(sound, dependenciesOf(sound, readLibraryImage(sound), {})));
}

TEST(UidNotes, NameTheWinnerOrTheLastThatLoses) {
    const RecordedBuilder builder{{1, 2, 3, 4}, L"name", {}, {}};
    const RecordedLibraries libraries{{L"folder", L"first", 0, 0, {builder}},
                                      {L"folder", L"second", 0, 0, {builder}}};
    const UidNotes notes(libraries);
    const auto expectNote = [&](std::size_t position, Verdict verdict, const wchar_t* other) {
        const std::vector<Finding> found = notes.notesOn({builder}, position);
        ASSERT_EQ(found.size(), 1u);
        EXPECT_EQ(found[0].verdict, verdict);
        EXPECT_EQ(found[0].subject, textOf(builder.uid));
        EXPECT_EQ(found[0].words, other);
    };
    expectNote(0, Verdict::uidTaken, L"folder\\second");
    expectNote(1, Verdict::uidWins, L"folder\\first");
    expectNote(UidNotes::afterAll, Verdict::uidWins, L"folder\\second");
    const RecordedLibraries twice{{L"folder", L"first", 0, 0, {builder, builder}}};
    EXPECT_TRUE(UidNotes(twice).notesOn({builder}, 0).empty()) << "no other library has it";
    EXPECT_TRUE(notes.notesOn({{{1, 2, 3, 5}, L"name", {}, {}}}, UidNotes::afterAll).empty());
}

} // namespace
