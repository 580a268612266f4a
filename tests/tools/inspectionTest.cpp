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
    EXPECT_TRUE(notes.notesOn({{{1, 2, 3, 5}, L"name", {}, {}}}, UidNotes::afterAll).empty());
}

} // namespace
