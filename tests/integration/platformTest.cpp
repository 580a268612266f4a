// SPDX-License-Identifier: BSL-1.0
/// Tests the platform layer with the same expectations on every system.
#include "components/platform/platform.h"

#include "components/platform/characters.h"
#include "tests/integration/managerFixture.h"

#include <chrono>
#include <clocale>
#include <ctime>
#include <limits>
#include <set>
#include <thread>

using namespace Mz;
using namespace Mz::platform;
using Mz::Test::builtComponent;
using Mz::Test::isMapped;
using Mz::Test::TemporaryDirectory;
using ::testing::IsEmpty;

namespace {

constexpr const char* entryPoint = "QrGetComponentDescription";

class Platform : public ::testing::Test {
  protected:
    std::filesystem::path copyOf(const std::wstring& component) const {
        const std::filesystem::path source = builtComponent(component);
        std::filesystem::copy_file(source, folder.path() / source.filename());
        return folder.path() / source.filename();
    }
    std::vector<std::wstring> candidates() const {
        std::vector<std::wstring> names;
        for (const DirectoryEntry& entry : listCandidates(folder.path()))
            names.push_back(entry.name);
        std::sort(names.begin(), names.end());
        return names;
    }

    TemporaryDirectory folder;
};

TEST_F(Platform, ConvertsAsciiNamesToNativeOnes) {
    ASSERT_TRUE(toNative(L"Some/Name.x"));
    EXPECT_EQ(*toNative(L"Some/Name.x"), std::filesystem::path("Some/Name.x").native());
    ASSERT_TRUE(toNative(L""));
    EXPECT_TRUE(toNative(L"")->empty());
    // A part of a longer text has no terminator.
    EXPECT_EQ(toNative(std::wstring_view(L"abcdef").substr(1, 3)),
              std::filesystem::path("bcd").native());
}

TEST_F(Platform, LowersAsciiLettersAndLeavesTheRestOfAscii) {
    std::wstring all;
    for (wchar_t c = 1; c < 128; ++c)
        all += c;
    const std::wstring lowered = lowerCase(all);
    ASSERT_EQ(lowered.size(), all.size());
    for (std::size_t index = 0; index < all.size(); ++index)
        EXPECT_EQ(lowered[index], all[index] >= L'A' && all[index] <= L'Z'
                                      ? static_cast<wchar_t>(all[index] + 32)
                                      : all[index]);
    EXPECT_EQ(lowerCase(L""), L"");
}

TEST_F(Platform, KnowsByWhichNameTheProgramWasStarted) {
    const std::optional<std::wstring> name = firstArgument();
    ASSERT_TRUE(name);
    EXPECT_NE(name->find(L"platformTests"), std::wstring::npos);
    EXPECT_EQ(name->find(L'"'), std::wstring::npos);
}

TEST_F(Platform, TellsTimeAndSizeOfAFile) {
    const auto file = folder.write("file", "12345");
    const std::optional<FileStatus> status = queryFile(file);
    ASSERT_TRUE(status);
    EXPECT_EQ(status->size, 5);
    EXPECT_TRUE(status->regular);
    const auto now = std::chrono::system_clock::to_time_t(std::chrono::system_clock::now());
    EXPECT_LE(static_cast<std::time_t>(status->time), now + 2);
    EXPECT_GE(static_cast<std::time_t>(status->time), now - 3600);
}

TEST_F(Platform, TellsTimesInSeconds) {
    const auto file = folder.write("file", "");
    const std::uint32_t before = queryFile(file)->time;
    std::filesystem::last_write_time(file, std::filesystem::last_write_time(file) -
                                               std::chrono::seconds(1000));
    EXPECT_EQ(queryFile(file)->time, before - 1000);
}

TEST_F(Platform, TellsSizesAboveFourGigabytes) {
    const auto file = folder.write("file", "");
    std::error_code error;
    std::filesystem::resize_file(file, 0x100000005, error); // A sparse file.
    ASSERT_FALSE(error) << error.message();
    EXPECT_EQ(queryFile(file)->size, 0x100000005);
    EXPECT_FALSE(exportsFunction(file, entryPoint));
}

TEST_F(Platform, TellsAFolderFromAFileAndNothingOfWhatIsNotThere) {
    ASSERT_TRUE(queryFile(folder.path()));
    EXPECT_FALSE(queryFile(folder.path())->regular);
    EXPECT_FALSE(queryFile(folder.path() / "nothing"));
    EXPECT_FALSE(queryFile(folder.path() / "nothing" / "below"));
    EXPECT_FALSE(queryFile(NativePath()));
}

TEST_F(Platform, ListsRegularFilesThatAreNotHidden) {
    folder.write("b.txt", "b");
    folder.write("A", "a");
    std::filesystem::create_directory(folder.path() / "sub");
    folder.write("sub/inner", "x");
    Mz::Test::hide(folder.write("hidden", "h"));
    EXPECT_EQ(candidates(), (std::vector<std::wstring>{L"A", L"b.txt"}));
}

TEST_F(Platform, ListsInAFixedOrderWithPathsThatOpen) {
    for (const char* name : {"c", "B", "a", "D"})
        folder.write(name, name);
    const std::vector<DirectoryEntry> first = listCandidates(folder.path());
    const std::vector<DirectoryEntry> second = listCandidates(folder.path());
    ASSERT_EQ(first.size(), 4u);
    std::set<FileIdentity> identities;
    for (std::size_t index = 0; index < first.size(); ++index) {
        EXPECT_EQ(first[index].name, second[index].name);
        ASSERT_TRUE(queryFile(first[index].path));
        EXPECT_EQ(queryFile(first[index].path)->size, 1);
        if (first[index].identity)
            identities.insert(*first[index].identity);
    }
    EXPECT_TRUE(identities.empty() || identities.size() == 4);
    EXPECT_EQ(first[0].name, L"a");
    EXPECT_EQ(first[1].name, L"B");
    EXPECT_EQ(first[2].name, L"c");
    EXPECT_EQ(first[3].name, L"D");
}

TEST_F(Platform, ListsInOneOrderOnEverySystem) {
    // The order is by UTF-16 code units in upper case. Letters sort before the signs between Z and
    // a, and characters above U+FFFF sort before the last ones below it. Windows needs no locale
    // for this.
    static_cast<void>(std::setlocale(LC_ALL, "C.UTF-8"));
    const std::vector<std::wstring> ordered{
        L"-",       L"0",        L"A1",           L"a2",          L"mesh",   L"mesh.x",
        L"meshA",   L"meshb",    L"meshImporter", L"meshz\u00E4", L"mesh[",  L"mesh]",
        L"mesh^",   L"mesh_obj", L"mesh`",        L"z",           L"{",      L"\u00C4a",
        L"\u00E4b", L"\u00D6",   L"\u0131",       L"\u0178",      L"\u017F", L"\u0391a",
        L"\u03B1b", L"\u0410",   L"\u0431",       L"\u0411b",     L"\u4E2D", L"\U0001F600",
        L"\uFF21a", L"\uFF41b"};
    for (std::size_t index = ordered.size(); index-- > 0;)
        folder.write(*toNative(ordered[index]), "x");
    std::vector<std::wstring> listed;
    for (const DirectoryEntry& entry : listCandidates(folder.path()))
        listed.push_back(entry.name);
    EXPECT_EQ(listed, ordered);
    std::setlocale(LC_ALL, "C");
}

TEST_F(Platform, ListsManyFiles) {
    for (int index = 0; index < 500; ++index)
        folder.write(std::to_string(1000 + index), "");
    EXPECT_EQ(listCandidates(folder.path()).size(), 500u);
}

TEST_F(Platform, ListsSeveralFoldersAtATime) {
    const TemporaryDirectory other;
    folder.write("one", "x");
    other.write("two", "x");
    const auto listings = listCandidates(std::vector<NativePath>{
        folder.path().native(), (folder.path() / "nothing").native(), other.path().native()});
    ASSERT_EQ(listings.size(), 3u);
    ASSERT_EQ(listings[0].size(), 1u);
    EXPECT_EQ(listings[0][0].name, L"one");
    EXPECT_THAT(listings[1], IsEmpty());
    ASSERT_EQ(listings[2].size(), 1u);
    EXPECT_EQ(listings[2][0].name, L"two");
}

TEST_F(Platform, ListsNothingOfWhatIsNoFolder) {
    EXPECT_THAT(listCandidates(folder.path() / "nothing"), IsEmpty());
    EXPECT_THAT(listCandidates(folder.write("file", "x")), IsEmpty());
    TemporaryDirectory empty;
    EXPECT_THAT(listCandidates(empty.path()), IsEmpty());
}

TEST_F(Platform, OpensFilesForReadingInBinary) {
    const auto file = folder.write("file", std::string("a\r\n\x1A\0b", 6));
    std::ifstream stream;
    ASSERT_TRUE(openForReading(stream, file));
    std::string content(10, ' ');
    stream.read(content.data(), 10);
    EXPECT_EQ(stream.gcount(), 6);
    EXPECT_EQ(content.substr(0, 6), std::string("a\r\n\x1A\0b", 6));
    // Other streams can open the file at the same time.
    std::ifstream another;
    EXPECT_TRUE(openForReading(another, file));
}

TEST_F(Platform, OpensNeitherFoldersNorWhatIsNotThere) {
    std::ifstream folderStream;
    EXPECT_FALSE(openForReading(folderStream, folder.path()));
    EXPECT_FALSE(folderStream.good());
    std::ifstream missing;
    EXPECT_FALSE(openForReading(missing, folder.path() / "nothing"));
    EXPECT_FALSE(missing.good());
}

TEST_F(Platform, FindsWhatALibraryExportsWithoutLoadingIt) {
    const auto file = copyOf(L"goodByHand");
    Mz::Test::forgetNotes();
    EXPECT_TRUE(exportsFunction(file, entryPoint));
    EXPECT_FALSE(exportsFunction(file, "QrGetComponentDescriptio"));
    EXPECT_FALSE(exportsFunction(file, "QrGetComponentDescription2"));
    EXPECT_FALSE(exportsFunction(file, "qrgetcomponentdescription"));
    EXPECT_FALSE(exportsFunction(file, ""));
    EXPECT_FALSE(isMapped(file));
    EXPECT_STREQ(Mz::Test::allNotes(), "");
}

TEST_F(Platform, FindsNoExportsInWhatIsNoLibrary) {
    EXPECT_FALSE(exportsFunction(folder.write("text", "QrGetComponentDescription"), entryPoint));
    EXPECT_FALSE(exportsFunction(folder.write("empty", ""), entryPoint));
    EXPECT_FALSE(exportsFunction(folder.path(), entryPoint));
    EXPECT_FALSE(exportsFunction(folder.path() / "nothing", entryPoint));
    EXPECT_FALSE(exportsFunction(copyOf(L"noEntryPoint"), entryPoint));
    EXPECT_FALSE(exportsFunction(copyOf(L"entryPointInDependency"), entryPoint));
}

TEST_F(Platform, LoadsFindsAndUnloadsALibrary) {
    const auto file = copyOf(L"goodByHand");
    EXPECT_FALSE(findLoadedLibrary(file));
    const Module module = loadLibrary(file);
    ASSERT_TRUE(module);
    EXPECT_TRUE(isMapped(file));
    EXPECT_EQ(findLoadedLibrary(file), module);
    EXPECT_EQ(findLoadedLibrary(file), module); // A lookup takes no reference.
    EXPECT_TRUE(findSymbol(module, entryPoint));
    EXPECT_FALSE(findSymbol(module, "noSuchFunction"));
    unloadLibrary(module);
    EXPECT_FALSE(isMapped(file));
    EXPECT_FALSE(findLoadedLibrary(file));
}

TEST_F(Platform, CountsTheLoadsOfALibrary) {
    const auto file = copyOf(L"goodByHand");
    const Module one = loadLibrary(file);
    const Module two = loadLibrary(file);
    EXPECT_EQ(one, two);
    unloadLibrary(one);
    EXPECT_TRUE(isMapped(file));
    unloadLibrary(two);
    EXPECT_FALSE(isMapped(file));
}

TEST_F(Platform, LoadsNothingThatIsNoLibrary) {
    EXPECT_FALSE(loadLibrary(folder.write("text", "no library")));
    EXPECT_FALSE(loadLibrary(folder.path() / "nothing"));
    EXPECT_FALSE(loadLibrary(folder.path()));
    EXPECT_FALSE(loadLibrary(copyOf(L"missesDependency")));
    unloadLibrary(nullptr);
}

TEST_F(Platform, UsesALibraryByLoadingIt) {
    const auto file = copyOf(L"goodByHand");
    const UsedLibrary used = useLibrary(file, entryPoint);
    EXPECT_TRUE(used.module);
    EXPECT_TRUE(used.loaded);
    EXPECT_TRUE(isMapped(file));
    unloadLibrary(used.module);
    EXPECT_FALSE(isMapped(file));
}

TEST_F(Platform, UsesAMappedLibraryWithoutTakingAReference) {
    const auto file = copyOf(L"goodByHand");
    const Module module = loadLibrary(file);
    const UsedLibrary used = useLibrary(file, entryPoint);
    EXPECT_EQ(used.module, module);
    EXPECT_FALSE(used.loaded);
    // A mapped library is used whatever it exports.
    EXPECT_EQ(useLibrary(file, "noSuchFunction").module, module);
    EXPECT_FALSE(useLibrary(file, "noSuchFunction").loaded);
    unloadLibrary(module);
    EXPECT_FALSE(isMapped(file));
}

TEST_F(Platform, UsesNothingThatDoesNotExportTheSymbol) {
    const auto file = copyOf(L"goodByHand");
    for (const auto& unusable : {file, copyOf(L"missesDependency"), folder.path(),
                                 folder.write("text", "no library"), folder.path() / "nothing"}) {
        const char* symbol = unusable == file ? "noSuchFunction" : entryPoint;
        const UsedLibrary used = useLibrary(unusable, symbol);
        EXPECT_FALSE(used.module);
        EXPECT_FALSE(used.loaded);
    }
    EXPECT_FALSE(isMapped(file));
}

TEST_F(Platform, FindsSymbolsInThatVeryLibraryOnly) {
    EXPECT_FALSE(findSymbol(nullptr, entryPoint));
    EXPECT_FALSE(findSymbol(nullptr, "malloc"));
    const Module module = loadLibrary(copyOf(L"entryPointInDependency"));
    ASSERT_TRUE(module);
    EXPECT_TRUE(findSymbol(module, "needsDependency"));
    EXPECT_FALSE(findSymbol(module, entryPoint));
    EXPECT_FALSE(findSymbol(module, "dependencyIsNeeded"));
    EXPECT_FALSE(findSymbol(module, "malloc"));
    unloadLibrary(module);
}

TEST_F(Platform, KeepsTheErrorModeAcrossNestedQuiet) {
    const QuietErrors outer;
    const QuietErrors inner;
    EXPECT_FALSE(loadLibrary(folder.write("text.dll", "no library")));
}

TEST_F(Platform, TellsThreadsApart) {
    const std::uint32_t own = currentThreadId();
    EXPECT_EQ(currentThreadId(), own);
    std::uint32_t other = own;
    std::thread([&other] { other = currentThreadId(); }).join();
    EXPECT_NE(own, other);
}

TEST_F(Platform, KnowsThePlainLocale) {
    ASSERT_TRUE(std::setlocale(LC_ALL, "C"));
    EXPECT_TRUE(usesPlainBytes());
}

TEST_F(Platform, ConvertsEveryByteInThePlainLocale) {
    const CharacterConverter converter;
    ASSERT_TRUE(converter.plainBytes());
    for (int byte = 0; byte < 256; ++byte) {
        wchar_t character = 0x7777;
        const char bytes[] = {static_cast<char>(byte), 'x'};
        EXPECT_EQ(converter.decode(std::string_view(bytes, 2), character), byte ? 1 : 0);
        EXPECT_EQ(character, static_cast<wchar_t>(byte));
        char out[maximumCharacterBytes] = {};
        EXPECT_EQ(converter.encode(static_cast<wchar_t>(byte), out), 1);
        EXPECT_EQ(out[0], static_cast<char>(byte));
    }
    char out[maximumCharacterBytes];
    EXPECT_EQ(converter.encode(L'\u0100', out), -1);
    EXPECT_EQ(converter.encode(std::numeric_limits<wchar_t>::max(), out), -1);
    wchar_t character;
    EXPECT_EQ(converter.decode("", character), -1);
}

TEST_F(Platform, ConvertsTextsInThePlainLocale) {
    EXPECT_EQ(toBytes(std::wstring_view(L"a\0\u00FF", 3)), std::string("a\0\xFF", 3));
    EXPECT_EQ(toBytes(L"a\u0100"), std::nullopt);
    EXPECT_EQ(toCharacters(std::string_view("a\0\xFF", 3)), std::wstring(L"a\0\u00FF", 3));
    EXPECT_EQ(toBytes(L""), "");
    EXPECT_EQ(toCharacters(""), L"");
}

} // namespace
