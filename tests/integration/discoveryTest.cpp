// SPDX-License-Identifier: BSL-1.0
/// Tests which files of which folders become library records, and what the records of other files
/// contain.
#include "tests/integration/managerFixture.h"

#include <fstream>
#include <iterator>

using namespace Mz;
using namespace Mz::Test;
using ::testing::IsEmpty;

namespace {

class Discovery : public ManagerTest {
  protected:
    std::vector<std::wstring> fileNames() {
        std::vector<std::wstring> result;
        for (const ComponentLibrary& library : manager->libraries)
            result.emplace_back(library.fileName.view());
        return result;
    }

    static std::string contentOf(const std::filesystem::path& file) {
        std::ifstream stream(file, std::ios::binary);
        return std::string(std::istreambuf_iterator<char>(stream), {});
    }

    /// Expects that the file was checked, has no builders, and has its time and size recorded. A
    /// later start then skips it.
    void expectNothing(const std::filesystem::path& file) {
        ComponentLibrary* library = find(file);
        ASSERT_TRUE(library);
        EXPECT_FALSE(library->module);
        EXPECT_TRUE(library->builders.empty());
        const std::optional<platform::FileStatus> status = platform::queryFile(file);
        EXPECT_EQ(library->fileTime, status->time);
        EXPECT_EQ(library->fileSize, status->size);
    }
};

TEST_F(Discovery, TakesEveryFileWhateverItsExtension) {
    folder.write("a.txt", "text");
    folder.write("b", "");
    folder.write(L"c" MZ_LIBRARY_EXTENSION, "no library");
    folder.write("d.x.y.z", "z");
    initialize();
    EXPECT_EQ(fileNames(),
              (std::vector<std::wstring>{L"a.txt", L"b", L"c" MZ_LIBRARY_EXTENSION, L"d.x.y.z"}));
    for (const ComponentLibrary& library : manager->libraries)
        expectNothing(folder.path() / library.fileName.view());
    EXPECT_THAT(names(), IsEmpty());
}

TEST_F(Discovery, LeavesOutSubFoldersEvenThoseNamedLikeALibrary) {
    std::filesystem::create_directory(folder.path() / L"sub");
    std::filesystem::copy_file(builtComponent(L"goodByHand"), folder.path() / L"sub" / L"inner");
    std::filesystem::create_directory(folder.path() / L"named" MZ_LIBRARY_EXTENSION);
    add(L"goodWithKit");
    initialize();
    EXPECT_EQ(names(), (Names{L"kit"}));
    EXPECT_EQ(manager->libraries.size(), 1u);
}

TEST_F(Discovery, LeavesOutHiddenFiles) {
    hide(add(L"goodByHand"));
    add(L"goodWithKit");
    initialize();
    EXPECT_EQ(names(), (Names{L"kit"}));
    EXPECT_EQ(manager->libraries.size(), 1u);
}

TEST_F(Discovery, TellsANameWithoutExtensionFromTheSameWithOne) {
    folder.write("readme", "text");
    add(L"goodByHand", L"readme" MZ_LIBRARY_EXTENSION);
    initialize();
    EXPECT_EQ(names(), (Names{L"Name", L"name", L"third"}));
    expectNothing(folder.path() / "readme");
    EXPECT_FALSE(isMapped(folder.path() / "readme"));
    EXPECT_TRUE(isMapped(folder.path() / L"readme" MZ_LIBRARY_EXTENSION));
}

TEST_F(Discovery, TellsANameWithoutExtensionFromTheSameThatTheHostLoaded) {
    folder.write("readme", "text");
    void* const host = loadAsHost(add(L"goodByHand", L"readme" MZ_LIBRARY_EXTENSION));
    ASSERT_TRUE(host);
    initialize();
    expectNothing(folder.path() / "readme");
    EXPECT_EQ(names(), (Names{L"Name", L"name", L"third"}));
    manager.reset();
    unloadAsHost(host);
}

TEST_F(Discovery, LoadsLibrariesOfAnyName) {
    add(L"goodByHand", L"readme");
    add(L"goodWithKit", L"With Blanks And.UPPER.Case");
    add(L"countedDescription", L"data.txt");
    initialize();
    EXPECT_EQ(fileNames(),
              (std::vector<std::wstring>{L"data.txt", L"readme", L"with blanks and.upper.case"}));
    EXPECT_EQ(names(), (Names{L"counted", L"Name", L"name", L"third", L"kit"}));
    EXPECT_EQ(maker(goodUid), "good");
    EXPECT_EQ(maker(kitUid), "kit");
    EXPECT_EQ(maker(countedUid), "counted");
}

TEST_F(Discovery, LoadsLibrariesFromFoldersOfAnyName) {
    const auto inner = folder.path() / "With Blanks" / "UPPER";
    std::filesystem::create_directories(inner);
    std::filesystem::copy_file(builtComponent(L"goodByHand"), inner / "file");
    manager->initialize(searchPathOf(inner).c_str());
    EXPECT_EQ(maker(goodUid), "good");
    ASSERT_EQ(manager->libraries.size(), 1u);
    EXPECT_EQ(manager->libraries.front().directory,
              ComponentManager::normalisePath(searchPathOf(inner).c_str(), false));
}

TEST_F(Discovery, GoesThroughTheFoldersInTheirOrderAndSkipsEmptyEntries) {
    TemporaryDirectory second;
    std::filesystem::copy_file(builtComponent(L"goodByHand"), second.path() / "a");
    add(L"goodWithKit", "z");
    std::wstring path = L";;";
    path += searchPathOf(folder.path());
    path += L";;;";
    path += searchPathOf(folder.path() / "no such folder");
    path += L";";
    path += searchPathOf(second.path());
    path += L";";
    manager->initialize(path.c_str());
    EXPECT_EQ(names(), (Names{L"kit", L"Name", L"name", L"third"}));
}

TEST_F(Discovery, ScansAFolderOnceThatIsNamedTwice) {
    const auto file = add(L"goodByHand");
    const std::wstring path = searchPathOf(folder.path());
    manager->initialize((path + L";" + path + L"/;" + path).c_str());
    EXPECT_EQ(names(), (Names{L"Name", L"name", L"third"}));
    EXPECT_EQ(manager->libraries.size(), 1u);
    restart();
    EXPECT_FALSE(isMapped(file));
}

TEST_F(Discovery, FindsNothingInAFileOrInNoFolder) {
    const auto file = add(L"goodByHand");
    manager->initialize(searchPathOf(file).c_str());
    EXPECT_TRUE(manager->initialised);
    EXPECT_THAT(names(), IsEmpty());
    EXPECT_THAT(fileNames(), IsEmpty());
}

TEST_F(Discovery, PassesOverALibraryTruncatedAtManyLengths) {
    const std::string whole = contentOf(builtComponent(L"goodByHand"));
    ASSERT_GT(whole.size(), 4096u);
    std::vector<std::size_t> lengths{0, 1, 2, 4, 16, 60, 63, 64, 65, 128, 512, 1024, 4095, 4096};
    for (std::size_t part = 1; part < 64; ++part)
        lengths.push_back(whole.size() * part / 64);
    lengths.push_back(whole.size() * 999 / 1000);
    for (const std::size_t length : lengths)
        folder.write(std::to_string(length), whole.substr(0, length));
    folder.write("whole", whole);
    initialize();
    EXPECT_GE(manager->libraries.size(), 70u);
    ASSERT_TRUE(find("whole"));
    EXPECT_TRUE(find("whole")->module);
    EXPECT_EQ(find("whole")->builders.size(), 3u);
}

TEST_F(Discovery, PassesOverALibraryForAnotherProcessor) {
    std::string content = contentOf(builtComponent(L"goodByHand"));
    // The offset of the machine type: 18 in an ELF header, 4 after the "PE" signature.
    const bool elf = content.substr(0, 4) == "\177ELF";
    const std::size_t position =
        elf ? 18
            : static_cast<std::size_t>(static_cast<unsigned char>(content[0x3C])) +
                  static_cast<std::size_t>(static_cast<unsigned char>(content[0x3D])) * 256 + 4;
    // 64-bit ARM; of a library for that, x86-64.
    constexpr char arm = '\xB7', x86_64 = '\x3E';
    content[position] = !elf ? '\x64' : content[position] == arm ? x86_64 : arm;
    content[position + 1] = static_cast<char>(elf ? 0x00 : 0xAA);
    const auto file = folder.write("foreign", content);
    add(L"goodWithKit", "zz");
    initialize();
    EXPECT_EQ(names(), (Names{L"kit"}));
    expectNothing(file);
}

TEST_F(Discovery, PassesOverAProgramThatExportsTheEntryPoint) {
    const auto program =
        buildFolder / "components" / "exportingProgram" / L"exportingProgram" MZ_PROGRAM_EXTENSION;
    std::filesystem::copy_file(program, folder.path() / "program");
    add(L"goodWithKit", "zz");
    initialize();
    EXPECT_EQ(names(), (Names{L"kit"}));
    EXPECT_FALSE(isMapped(folder.path() / "program"));
}

TEST_F(Discovery, PassesOverTwoProgramsThatExportTheEntryPointAndNeedLibraries) {
    // Both programs are linked for the same address. The first gets it, the second is relocated.
    const auto program =
        buildFolder / "components" / "kitProgram" / L"kitProgram" MZ_PROGRAM_EXTENSION;
    const auto first = folder.path() / L"first" MZ_PROGRAM_EXTENSION;
    const auto second = folder.path() / L"second" MZ_PROGRAM_EXTENSION;
    std::filesystem::copy_file(program, first);
    std::filesystem::copy_file(program, second);
    add(L"goodWithKit", "zz");
    initialize();
    EXPECT_EQ(names(), (Names{L"kit"}));
    for (const auto& file : {first, second}) {
        EXPECT_FALSE(isMapped(file));
        expectNothing(file);
    }
}

TEST_F(Discovery, NotesAFailedFileSoThatALaterStartDoesNotTryIt) {
    const auto file = folder.write("text", "text");
    initialize();
    const std::uint32_t time = find(file)->fileTime;
    const int64 size = find(file)->fileSize;
    restart();
    // A library of the same time and size replaces the text file. The manager must not read it.
    const auto stamp = std::filesystem::last_write_time(file);
    add(L"goodByHand", "text");
    std::filesystem::last_write_time(file, stamp);
    ComponentLibrary& library = record(file, false);
    library.fileTime = time;
    library.fileSize = static_cast<int64>(std::filesystem::file_size(file));
    EXPECT_EQ(size, 4);
    initialize();
    EXPECT_THAT(names(), IsEmpty());
    EXPECT_FALSE(isMapped(file));
    EXPECT_STREQ(allNotes(), "");
}

} // namespace
