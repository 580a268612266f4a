// SPDX-License-Identifier: BSL-1.0
/// Tests what only the Linux platform layer has: the locale's encoding, upper case without the
/// system, symlinks, pipes, and a shortage of descriptors.
#include "components/platform/characters.h"
#include "components/platform/platform.h"
#include "components/platform/upperCase.h"
#include "tests/integration/managerFixture.h"
#include "tests/support/failingOpen.h"

#include <cerrno>
#include <clocale>
#include <dirent.h>
#include <dlfcn.h>
#include <locale.h>
#include <sys/stat.h>

using namespace Mz::platform;
using Mz::Test::builtComponent;
using Mz::Test::TemporaryDirectory;

namespace {

/// This program's `readdir` adds this to each inode number.
ino_t listingOffset = 0;

} // namespace

/// Replaces the C library's function in this program.
extern "C" dirent* readdir(DIR* directory) {
    using Function = dirent*(DIR*);
    static const auto next = reinterpret_cast<Function*>(::dlsym(RTLD_NEXT, "readdir"));
    dirent* const entry = next(directory);
    if (entry)
        entry->d_ino += listingOffset;
    return entry;
}

namespace {

constexpr const char* entryPoint = "QrGetComponentDescription";

class PosixPlatform : public ::testing::Test {
  protected:
    ~PosixPlatform() override { std::setlocale(LC_ALL, "C"); }
    static void useUtf8() { ASSERT_TRUE(std::setlocale(LC_ALL, "C.UTF-8")); }
};

TEST_F(PosixPlatform, OpensByTheNameAsFound) {
    EXPECT_EQ(openingPath(L"\\a", L"b", "/A/b"), "/A/b");
    EXPECT_EQ(openingPath(L"\\a", L"", "/A"), "/A");
}

TEST_F(PosixPlatform, LowersAsciiOnlyInEveryLocale) {
    EXPECT_EQ(lowerCase(L"\u00C4\u0410Z"), L"\u00C4\u0410z");
    useUtf8();
    EXPECT_EQ(lowerCase(L"\u00C4\u0410Z"), L"\u00C4\u0410z");
}

TEST_F(PosixPlatform, TellsThePlainLocaleFromEveryOther) {
    for (const char* plain : {"C", "POSIX"}) {
        ASSERT_TRUE(std::setlocale(LC_ALL, plain));
        EXPECT_TRUE(usesPlainBytes());
    }
    useUtf8();
    EXPECT_FALSE(usesPlainBytes());
    ASSERT_TRUE(std::setlocale(LC_CTYPE, "C"));
    EXPECT_TRUE(usesPlainBytes());
}

TEST_F(PosixPlatform, AsksForTheLocaleOfTheCallingThread) {
    const locale_t utf8 = ::newlocale(LC_ALL_MASK, "C.UTF-8", nullptr);
    ASSERT_TRUE(utf8);
    const locale_t before = ::uselocale(utf8);
    EXPECT_FALSE(usesPlainBytes());
    EXPECT_EQ(toBytes(L"\u00E4"), "\xC3\xA4");
    ::uselocale(before);
    EXPECT_TRUE(usesPlainBytes());
    ::freelocale(utf8);
}

TEST_F(PosixPlatform, ConvertsTextsAsTheLocaleSays) {
    useUtf8();
    EXPECT_EQ(toBytes(L"a\u00E4\u4E2D\U0001F600"), "a\xC3\xA4\xE4\xB8\xAD\xF0\x9F\x98\x80");
    EXPECT_EQ(toCharacters("a\xC3\xA4\xE4\xB8\xAD\xF0\x9F\x98\x80"), L"a\u00E4\u4E2D\U0001F600");
    EXPECT_EQ(toCharacters(std::string_view("a\0b", 3)), std::wstring(L"a\0b", 3));
    EXPECT_EQ(toBytes(std::wstring_view(L"a\0b", 3)), std::string("a\0b", 3));
    EXPECT_EQ(toBytes(L"a\xD800"), std::nullopt);
    EXPECT_EQ(toCharacters("\xC3"), std::nullopt);
    EXPECT_EQ(toCharacters("a\xFF"), std::nullopt);
    EXPECT_EQ(toCharacters("\xE4\xB8x"), std::nullopt);
    EXPECT_EQ(toCharacters("\xC0\x80"), std::nullopt);
}

TEST_F(PosixPlatform, HasNoNativeNameForWhatTheLocaleCannotWrite) {
    EXPECT_EQ(toNative(L"\u4E2D"), std::nullopt);
    ASSERT_TRUE(toNative(L"\u00E4"));
    EXPECT_EQ(toNative(L"\u00E4"), "\xE4");
    useUtf8();
    ASSERT_TRUE(toNative(L"\u4E2D"));
    EXPECT_EQ(toNative(L"\u4E2D"), "\xE4\xB8\xAD");
}

TEST_F(PosixPlatform, KnowsOneFileByItsNames) {
    TemporaryDirectory folder;
    const NativePath file = folder.write("file", "x");
    const NativePath other = folder.write("other", "x");
    const NativePath link = folder.path() / "link";
    const NativePath symbolic = folder.path() / "symbolic";
    std::filesystem::create_hard_link(file, link);
    std::filesystem::create_symlink("file", symbolic);
    EXPECT_TRUE(isSameFile(file, link));
    EXPECT_TRUE(isSameFile(file, symbolic));
    EXPECT_FALSE(isSameFile(file, other));
    EXPECT_FALSE(isSameFile(file, folder.path() / "nothing"));
    const std::vector<DirectoryEntry> entries = listCandidates(folder.path());
    ASSERT_EQ(entries.size(), 4u);
    EXPECT_EQ(entries[0].identity, entries[1].identity);
    EXPECT_NE(entries[0].identity, entries[2].identity);
    EXPECT_EQ(entries[0].identity, entries[3].identity);
}

TEST_F(PosixPlatform, ListsNeitherPipesNorDeadLinks) {
    TemporaryDirectory folder;
    ASSERT_EQ(::mkfifo((folder.path() / "pipe").c_str(), 0600), 0);
    std::filesystem::create_symlink("nowhere", folder.path() / "dead");
    std::filesystem::create_symlink(folder.write("file", "x"), folder.path() / "link");
    const std::vector<DirectoryEntry> entries = listCandidates(folder.path());
    ASSERT_EQ(entries.size(), 2u);
    EXPECT_EQ(entries[0].name, L"file");
    EXPECT_EQ(entries[1].name, L"link");
    ASSERT_TRUE(entries[0].identity);
    EXPECT_EQ(entries[0].identity, entries[1].identity);
}

TEST_F(PosixPlatform, ListsByUtf16CodeUnitsInUpperCaseWhateverTheLocale) {
    TemporaryDirectory folder;
    for (const char* name : {"mesh_obj", "meshImporter", "mesh\\x", "mesh]", "mesh[", "lib.so",
                             "LIB.so", "Lib.so", "\xC3\xA4", "\xC3\x84"})
        folder.write(name, "x");
    const auto names = [&] {
        std::string result;
        for (const DirectoryEntry& entry : listCandidates(folder.path()))
            result += std::filesystem::path(entry.path).filename().native() + " ";
        return result;
    };
    const std::string expected = "LIB.so Lib.so lib.so meshImporter mesh[ mesh\\x mesh] mesh_obj "
                                 "\xC3\x84 \xC3\xA4 ";
    EXPECT_EQ(names(), expected);
    useUtf8();
    EXPECT_EQ(names(), expected);
}

TEST_F(PosixPlatform, TakesLettersAsUpperCaseOneByOneOnly) {
    EXPECT_EQ(upperCase(u'\u00FF'), u'\u0178');
    EXPECT_EQ(upperCase(u'\u01C6'), u'\u01C4');
    EXPECT_EQ(upperCase(u'\u1F80'), u'\u1F88');
    EXPECT_EQ(upperCase(u'\uFF5A'), u'\uFF3A');
    // Letters that are not the lower case of one other letter, or whose upper case is two letters
    // or ASCII.
    for (const char16_t unit : {u'\u00DF', u'\u0131', u'\u017F', u'\u00B5', u'\u03C2', u'\u01C5',
                                u'\u0100', u'[', u'{', u'`', u'@', u'\0', u'\uFFFF'})
        EXPECT_EQ(upperCase(unit), unit) << static_cast<unsigned int>(unit);
}

TEST_F(PosixPlatform, SortsByTheCodeUnitsInUpperCase) {
    EXPECT_EQ(sortKey(L"aB_\u00E4"), sortKey(L"Ab_\u00C4"));
    EXPECT_EQ(sortKey(L"\U0001F600\uFF41"), sortKey(L"\U0001F600\uFF21"));
    // In this order: each is the last or the first of its number of bytes or of its kind of units.
    std::string before;
    for (const wchar_t* name :
         {L"A", L"AA", L"\x7F", L"\x80", L"\u07FF", L"\u0800", L"\uD7FF", L"\U00010000",
          L"\U00010001", L"\U0010FFFF", L"\uE000", L"\uFFFE", L"\uFFFF", L"\uFFFF\x01"}) {
        const std::string key = sortKey(name);
        EXPECT_LT(before, key) << static_cast<unsigned int>(*name);
        before = key;
    }
}

TEST_F(PosixPlatform, KnowsOneFileByItsNamesThoughListingsNumberFilesOtherwise) {
    // Overlay file systems and bind-mounted files give listings other inode numbers than `stat`.
    const TemporaryDirectory folder;
    const TemporaryDirectory other;
    folder.write("file", "x");
    folder.write("unlike", "x");
    std::filesystem::create_symlink("file", folder.path() / "link");
    std::filesystem::create_symlink(folder.path() / "unlike", other.path() / "link");
    listingOffset = 1000000;
    const auto listings =
        listCandidates(std::vector<NativePath>{folder.path().native(), other.path().native()});
    listingOffset = 0;
    ASSERT_EQ(listings[0].size(), 3u);
    ASSERT_EQ(listings[1].size(), 1u);
    EXPECT_EQ(listings[0][0].identity, listings[0][1].identity);
    EXPECT_NE(listings[0][0].identity, listings[0][2].identity);
    EXPECT_EQ(listings[0][2].identity, listings[1][0].identity);
}

TEST_F(PosixPlatform, TellsTheStatusOfWhatALinkLeadsTo) {
    TemporaryDirectory folder;
    std::filesystem::create_symlink(folder.write("file", "1234567"), folder.path() / "link");
    EXPECT_EQ(queryFile(folder.path() / "link")->size, 7);
    EXPECT_TRUE(queryFile(folder.path() / "link")->regular);
    ASSERT_EQ(::mkfifo((folder.path() / "pipe").c_str(), 0600), 0);
    EXPECT_FALSE(queryFile(folder.path() / "pipe")->regular);
}

TEST_F(PosixPlatform, UsesWhatIsMappedByAnotherName) {
    TemporaryDirectory folder;
    const std::filesystem::path link = folder.path() / "link";
    std::filesystem::create_symlink(builtComponent(L"goodByHand"), link);
    const Module module = loadLibrary(builtComponent(L"goodByHand").native());
    ASSERT_TRUE(module);
    const UsedLibrary used = useLibrary(link, "QrGetComponentDescription");
    EXPECT_EQ(used.module, module);
    EXPECT_FALSE(used.loaded);
    unloadLibrary(module);
    EXPECT_FALSE(Mz::Test::isMapped(builtComponent(L"goodByHand")));
}

TEST_F(PosixPlatform, UsesWhatIsMappedThoughItsFileIsReplaced) {
    TemporaryDirectory folder;
    const std::filesystem::path file = folder.path() / "library.so";
    std::filesystem::copy_file(builtComponent(L"goodByHand"), file);
    const Module module = loadLibrary(file);
    ASSERT_TRUE(module);
    std::filesystem::rename(folder.write("text", "no library"), file);
    const UsedLibrary used = useLibrary(file, "QrGetComponentDescription");
    EXPECT_EQ(used.module, module);
    EXPECT_FALSE(used.loaded);
    unloadLibrary(module);
    EXPECT_FALSE(findLoadedLibrary(file));
}

TEST_F(PosixPlatform, DoesNotKnowAFileThatItCannotOpenForWantOfResources) {
    const std::filesystem::path file = builtComponent(L"goodByHand");
    const std::filesystem::path other = builtComponent(L"goodWithKit");
    const Module mapped = loadLibrary(other);
    for (const int error : {EMFILE, ENFILE, ENOMEM, EIO, EINTR, ESTALE}) {
        const Mz::Test::FailingOpen fails(error);
        EXPECT_EQ(queryExport(file, entryPoint), ExportState::unknown) << error;
        EXPECT_FALSE(exportsFunction(file, entryPoint)) << error;
        const UsedLibrary used = useLibrary(file, entryPoint);
        EXPECT_FALSE(used.module) << error;
        EXPECT_TRUE(used.unknown) << error;
        EXPECT_EQ(useLibrary(other, entryPoint).module, mapped) << error;
    }
    unloadLibrary(mapped);
    EXPECT_EQ(queryExport(file, entryPoint), ExportState::exported);
}

TEST_F(PosixPlatform, KnowsThatAFileItMayNotOrCannotOpenIsNoLibrary) {
    const std::filesystem::path file = builtComponent(L"goodByHand");
    for (const int error : {EACCES, ENOENT, ELOOP}) {
        const Mz::Test::FailingOpen fails(error);
        EXPECT_EQ(queryExport(file, entryPoint), ExportState::absent) << error;
        EXPECT_FALSE(useLibrary(file, entryPoint).unknown) << error;
    }
}

TEST_F(PosixPlatform, DoesNotWaitForAPipeItIsToLookInto) {
    TemporaryDirectory folder;
    ASSERT_EQ(::mkfifo((folder.path() / "pipe").c_str(), 0600), 0);
    EXPECT_FALSE(exportsFunction(folder.path() / "pipe", "QrGetComponentDescription"));
}

} // namespace
