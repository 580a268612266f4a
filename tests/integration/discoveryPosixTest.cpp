// SPDX-License-Identifier: BSL-1.0
/// Tests discovery with files that only Linux has: pipes, symlinks, and names that differ in letter
/// case alone.
#include "components/componentKit/hostKit.h"
#include "tests/integration/managerFixture.h"
#include "tests/support/failingOpen.h"

#include <cerrno>
#include <clocale>
#include <fcntl.h>
#include <fstream>
#include <locale.h>
#include <optional>
#include <pthread.h>
#include <string_view>
#include <sys/ioctl.h>
#include <sys/stat.h>
#include <thread>
#include <unistd.h>

using namespace Mz;
using namespace Mz::Test;
using ::testing::IsEmpty;

namespace {

class PosixDiscovery : public ManagerTest {};

TEST_F(PosixDiscovery, DoesNotOpenAPipe) {
    // Opening a pipe for reading blocks until it has a writer. This one never has one.
    ASSERT_EQ(::mkfifo((folder.path() / "pipe.so").c_str(), 0600), 0);
    add(L"goodWithKit");
    initialize();
    EXPECT_EQ(names(), (Names{L"kit"}));
    EXPECT_EQ(manager->libraries.size(), 1u);
}

TEST_F(PosixDiscovery, DoesNotOpenAPipeThatTookTheFilesPlaceLater) {
    const auto file = add(L"goodByHand", "file");
    ComponentLibrary& library = record(file);
    recordBuilder(library, goodUid, L"as recorded");
    initialize();
    std::filesystem::remove(file);
    ASSERT_EQ(::mkfifo(file.c_str(), 0600), 0);
    // Open both ends so that a reader does not block. Write enough for a whole ELF header.
    const int pipe = ::open(file.c_str(), O_RDWR | O_NONBLOCK);
    const std::string garbage(8192, 'x');
    ASSERT_EQ(::write(pipe, garbage.data(), garbage.size()), 8192);
    EXPECT_FALSE(manager->getBuilder(goodUid));
    int left = 0;
    ASSERT_EQ(::ioctl(pipe, FIONREAD, &left), 0);
    EXPECT_EQ(left, 8192);
    ::close(pipe);
}

TEST_F(PosixDiscovery, PassesOverALinkThatLeadsNowhereAndOneInACircle) {
    std::filesystem::create_symlink(folder.path() / "nowhere", folder.path() / "dangling.so");
    std::filesystem::create_symlink(folder.path() / "circle.so", folder.path() / "circle.so");
    std::filesystem::create_directory_symlink(folder.path(), folder.path() / "folder.so");
    add(L"goodWithKit");
    initialize();
    EXPECT_EQ(names(), (Names{L"kit"}));
    EXPECT_EQ(manager->libraries.size(), 1u);
}

TEST_F(PosixDiscovery, MakesOneRecordOfAFileWithSeveralNames) {
    const auto file = add(L"goodByHand", "m.so");
    std::filesystem::create_symlink(file, folder.path() / "z.so");
    std::filesystem::create_hard_link(file, folder.path() / "b.so");
    initialize();
    EXPECT_EQ(names(), (Names{L"Name", L"name", L"third"}));
    ASSERT_EQ(manager->libraries.size(), 1u);
    EXPECT_EQ(manager->libraries.front().fileName, L"b.so");
    EXPECT_EQ(noted("entry"), 1);
    restart();
    EXPECT_FALSE(isMapped(file));
}

TEST_F(PosixDiscovery, MakesOneRecordOfAFileThatTwoFoldersLeadTo) {
    const auto file = add(L"goodByHand");
    TemporaryDirectory second;
    std::filesystem::create_directory_symlink(folder.path(), second.path() / "link");
    manager->initialize(
        (folder.text() + L";" + (second.path() / "link").wstring() + L";" + second.text()).c_str());
    EXPECT_EQ(names(), (Names{L"Name", L"name", L"third"}));
    EXPECT_EQ(manager->libraries.size(), 1u);
}

TEST_F(PosixDiscovery, FollowsALinkToALibraryElsewhere) {
    std::filesystem::create_symlink(builtComponent(L"goodByHand"), folder.path() / "link");
    initialize();
    EXPECT_EQ(maker(goodUid), "good");
}

TEST_F(PosixDiscovery, KeepsOneRecordEachOfNamesThatDifferInLetterCaseOnly) {
    add(L"goodByHand", "lib.so");
    add(L"goodWithKit", "LIB.so");
    initialize();
    ASSERT_EQ(manager->libraries.size(), 2u);
    for (const ComponentLibrary& library : manager->libraries)
        EXPECT_EQ(library.fileName, L"lib.so");
    EXPECT_EQ(maker(goodUid), "good");
    EXPECT_EQ(maker(kitUid), "kit");
    EXPECT_EQ(names(), (Names{L"kit", L"Name", L"name", L"third"})); // In byte order.
}

TEST_F(PosixDiscovery, KeepsBothRecordsOfSuchNamesFromAnEarlierStart) {
    const auto upper = add(L"goodWithKit", "LIB.so");
    const auto lower = add(L"goodByHand", "lib.so");
    recordBuilder(record(upper), kitUid, L"recorded kit");
    recordBuilder(record(lower), goodUid, L"recorded good");
    initialize();
    EXPECT_EQ(manager->libraries.size(), 2u);
    EXPECT_EQ(names(), (Names{L"recorded kit", L"recorded good"}));
    EXPECT_FALSE(isMapped(upper));
    EXPECT_FALSE(isMapped(lower));
    EXPECT_EQ(maker(goodUid), "good");
    EXPECT_EQ(maker(kitUid), "kit");
}

TEST_F(PosixDiscovery, KeepsTheRecordsOfAnyNumberOfSuchNames) {
    const auto first = add(L"goodWithKit", "LIB.so");
    const auto second = add(L"countedDescription", "LIb.so");
    const auto third = add(L"goodByHand", "lIB.so");
    const auto fourth = add(L"manyBuilders", "lib.so");
    recordBuilder(record(first), kitUid, L"first");
    recordBuilder(record(second), countedUid, L"second");
    recordBuilder(record(third), goodUid, L"third");
    recordBuilder(record(fourth), faultyUid, L"fourth");
    initialize();
    EXPECT_EQ(names(), (Names{L"first", L"second", L"third", L"fourth"}));
    std::vector<platform::NativePath> paths;
    for (const ComponentLibrary& library : manager->libraries)
        paths.push_back(library.foundPath);
    EXPECT_EQ(paths,
              (std::vector{first.native(), second.native(), third.native(), fourth.native()}));
    EXPECT_EQ(maker(kitUid), "kit");
    EXPECT_EQ(maker(goodUid), "good");
}

TEST_F(PosixDiscovery, KeepsTheRecordsOfSuchFoldersToo) {
    std::filesystem::create_directory(folder.path() / "Plug");
    std::filesystem::create_directory(folder.path() / "plug");
    const auto upper = add(L"goodWithKit", "Plug/c.so");
    const auto lower = add(L"goodByHand", "plug/c.so");
    recordBuilder(record(upper), kitUid, L"recorded kit");
    recordBuilder(record(lower), goodUid, L"recorded good");
    manager->initialize((folder.text() + L"/Plug;" + folder.text() + L"/plug").c_str());
    EXPECT_EQ(names(), (Names{L"recorded kit", L"recorded good"}));
    EXPECT_EQ(maker(goodUid), "good");
    EXPECT_EQ(maker(kitUid), "kit");
}

TEST_F(PosixDiscovery, ReadsSuchFilesAfreshWhenNobodyCanSayWhoseTheRecordsAre) {
    const auto lower = add(L"goodByHand", "lib.so");
    recordBuilder(record(lower), goodUid, L"recorded good");
    add(L"goodWithKit", "LIB.so"); // Sorts before lib.so.
    initialize();
    EXPECT_EQ(names(), (Names{L"kit", L"Name", L"name", L"third"}));
    EXPECT_EQ(maker(goodUid), "good");
    EXPECT_EQ(maker(kitUid), "kit");
}

TEST_F(PosixDiscovery, ReadsSuchAFileAfreshWhenItsNamesakeIsGone) {
    const auto lower = add(L"goodByHand", "lib.so");
    const auto upper = add(L"goodByHand", "LIB.so");
    // Both files have the same time and size, so these cannot tell the records apart.
    std::filesystem::last_write_time(upper, std::filesystem::last_write_time(lower));
    recordBuilder(record(upper), kitUid, L"the upper one's");
    recordBuilder(record(lower), countedUid, L"the lower one's");
    std::filesystem::remove(lower);
    initialize();
    ASSERT_EQ(manager->libraries.size(), 1u);
    EXPECT_EQ(names(), (Names{L"Name", L"name", L"third"}));
    EXPECT_EQ(maker(goodUid), "good");
}

TEST_F(PosixDiscovery, ReadsSuchFilesAfreshWhenOneOfThreeIsGone) {
    const auto one = add(L"goodWithKit", "LIB.so");
    const auto two = add(L"goodWithKit", "Lib.so");
    const auto three = add(L"goodByHand", "lib.so");
    for (const auto& file : {one, two, three})
        recordBuilder(record(file), countedUid, L"as recorded");
    std::filesystem::remove(two);
    initialize();
    EXPECT_EQ(names(), (Names{L"kit", L"Name", L"name", L"third"}));
}

TEST_F(PosixDiscovery, BeginsAnewAfterAThreadEndedInTheMiddle) {
    const auto first = add(L"goodWithKit", "a.so");
    const auto second = add(L"goodByHand", "b.so");
    add(L"manyBuilders", "c.so");
    setHook([](const char* event) {
        if (std::string_view(event) == "enumerate")
            ::pthread_exit(nullptr);
    });
    std::thread([this] { initialize(); }).join();
    setHook(nullptr);
    EXPECT_FALSE(manager->initialised);
    EXPECT_EQ(noted("enumerate"), 1);
    EXPECT_FALSE(isMapped(second));
    std::filesystem::remove(first);
    TemporaryDirectory other;
    std::filesystem::copy_file(second, other.path() / "b.so");
    manager->initialize(other.text().c_str());
    EXPECT_EQ(names(), (Names{L"Name", L"name", L"third"}));
    EXPECT_FALSE(manager->getBuilder(kitUid));
    EXPECT_EQ(maker(goodUid), "good");
    EXPECT_FALSE(platform::findLoadedLibrary(first));
    EXPECT_EQ(manager->builderIndex.size(), 3u);
}

TEST_F(PosixDiscovery, KeepsWhatIsKnownForTheNextAttempt) {
    add(L"goodWithKit", "a.so");
    const auto second = add(L"goodByHand", "b.so");
    setHook([](const char* event) {
        if (std::string_view(event) == "enumerate")
            ::pthread_exit(nullptr);
    });
    std::thread([this] { initialize(); }).join();
    setHook(nullptr);
    initialize();
    EXPECT_TRUE(manager->initialised);
    EXPECT_EQ(names(), (Names{L"kit", L"Name", L"name", L"third"}));
    EXPECT_EQ(maker(kitUid), "kit");
    EXPECT_EQ(maker(goodUid), "good");
}

TEST_F(PosixDiscovery, LoadsAFileWhoseNameHasUpperCaseAndOthersNot) {
    const auto file = add(L"goodByHand", "UPPER.SO");
    initialize();
    EXPECT_EQ(maker(goodUid), "good");
    EXPECT_EQ(manager->libraries.front().fileName, L"upper.so");
    EXPECT_EQ(manager->libraries.front().foundPath, file);
}

/// The loader expands some words in the path of a library.
TEST_F(PosixDiscovery, PassesOverALibraryWhoseFolderHasAWordThatTheLoaderExpands) {
    for (const char* name : {"a$LIB", "b$ORIGIN", "c${PLATFORM}", "d$OTHER"}) {
        std::filesystem::create_directory(folder.path() / name);
        std::filesystem::copy_file(builtComponent(L"goodWithKit"), folder.path() / name / "kit.so");
        restart();
        manager->initialize(searchPathOf(folder.path() / name).c_str());
        EXPECT_EQ(names().size(), std::string(name) == "d$OTHER" ? 1U : 0U) << name;
    }
}

TEST_F(PosixDiscovery, TakesNamesByteByByteInThePlainLocale) {
    ASSERT_STREQ(std::setlocale(LC_ALL, nullptr), "C");
    const auto file = add(L"goodByHand", "caf\xC3\xA9.so");
    const auto broken = add(L"goodWithKit", "b\xFF.so");
    initialize();
    ASSERT_EQ(manager->libraries.size(), 2u);
    EXPECT_EQ(manager->libraries.front().fileName, L"b\xFF.so");
    EXPECT_EQ(manager->libraries.back().fileName, L"caf\xC3\xA9.so");
    EXPECT_EQ(maker(goodUid), "good");
    EXPECT_EQ(maker(kitUid), "kit");
}

TEST_F(PosixDiscovery, TakesNamesAsTheLocaleSaysAndLeavesOutThoseThatAreNone) {
    ASSERT_TRUE(std::setlocale(LC_ALL, "C.UTF-8"));
    add(L"goodByHand", "caf\xC3\xA9 \xE4\xB8\xAD.so");
    add(L"goodWithKit", "b\xFF.so");
    initialize();
    ASSERT_EQ(manager->libraries.size(), 1u);
    EXPECT_EQ(manager->libraries.front().fileName, L"caf\u00E9 \u4E2D.so");
    EXPECT_EQ(maker(goodUid), "good");
    std::setlocale(LC_ALL, "C");
}

TEST_F(PosixDiscovery, SearchesAFolderNamedInTheLocalesLetters) {
    ASSERT_TRUE(std::setlocale(LC_ALL, "C.UTF-8"));
    const auto inner = folder.path() / "\xC3\x84 \xE4\xB8\xAD";
    std::filesystem::create_directory(inner);
    std::filesystem::copy_file(builtComponent(L"goodByHand"), inner / "file");
    manager->initialize((folder.text() + L"/\u00C4 \u4E2D").c_str());
    EXPECT_EQ(maker(goodUid), "good");
    std::setlocale(LC_ALL, "C");
}

TEST_F(PosixDiscovery, PassesOverAFolderThatTheLocaleCannotName) {
    add(L"goodWithKit");
    manager->initialize((L"/\u4E2D;" + folder.text()).c_str());
    EXPECT_EQ(names(), (Names{L"kit"}));
}

TEST_F(PosixDiscovery, SearchesFoldersWithDotsInTheirNamesAsTheSystemMeansThem) {
    std::filesystem::create_directory(folder.path() / "sub");
    add(L"goodByHand");
    manager->initialize((folder.text() + L"/sub/../.").c_str());
    EXPECT_EQ(maker(goodUid), "good");
}

TEST_F(PosixDiscovery, SearchesARelativeFolder) {
    add(L"goodByHand");
    const auto before = std::filesystem::current_path();
    std::filesystem::current_path(folder.path().parent_path());
    manager->initialize(folder.path().filename().wstring().c_str());
    EXPECT_EQ(maker(goodUid), "good");
    std::filesystem::current_path(before);
}

TEST_F(PosixDiscovery, DoesNotCallDataNamedLikeTheEntryPoint) {
    const auto file = add(L"dataEntryPoint");
    initialize();
    EXPECT_THAT(names(), IsEmpty());
    EXPECT_FALSE(isMapped(file));
    EXPECT_EQ(find(file)->fileTime, platform::queryFile(file)->time);
}

TEST_F(PosixDiscovery, DoesNotCallDataNamedLikeTheEntryPointOfALibraryThatTheHostLoaded) {
    const auto file = add(L"dataEntryPoint");
    void* const host = loadAsHost(file);
    ASSERT_TRUE(host);
    initialize();
    EXPECT_THAT(names(), IsEmpty());
    manager.reset();
    unloadAsHost(host);
}

TEST_F(PosixDiscovery, LooksIntoACandidateWithoutMappingItOrRunningAnythingOfIt) {
    const std::filesystem::path mark = folder.path().string() + ".mark";
    setEnvironment("MZ_TEST_MARK", mark.string());
    const auto file = add(L"noEntryPoint");
    EXPECT_FALSE(platform::exportsFunction(file, "QrGetComponentDescription"));
    EXPECT_TRUE(platform::exportsFunction(file, "QrGetComponentDescriptions"));
    EXPECT_FALSE(isMapped(file));
    EXPECT_FALSE(std::filesystem::exists(mark));
}

TEST_F(PosixDiscovery, PassesOverATruncatedLibraryAtEveryPage) {
    std::ifstream stream(builtComponent(L"goodByHand"), std::ios::binary);
    const std::string whole(std::istreambuf_iterator<char>(stream), {});
    int step = 0;
    for (std::size_t length = 0; length < whole.size(); length += 1024)
        folder.write(std::to_string(step++), whole.substr(0, length));
    folder.write("cutLast", whole.substr(0, whole.size() - 1));
    add(L"goodWithKit", "zz");
    initialize();
    EXPECT_EQ(names(), (Names{L"kit"}));
}

/// Lets `open` fail as soon as the first library enumerates its builders.
std::optional<FailingOpen> shortage;

TEST_F(PosixDiscovery, NotesNothingOfAFileThatItCannotOpenForWantOfDescriptors) {
    add(L"goodByHand", "a.so");
    const auto later = add(L"goodWithKit", "b.so");
    const auto changed = add(L"countedDescription", "c.so");
    ComponentLibrary& recorded = record(changed);
    recordBuilder(recorded, countedUid, L"as recorded");
    recorded.fileTime -= 1;
    const std::uint32_t oldTime = recorded.fileTime;
    setHook([](const char* event) {
        if (std::string_view(event) == "enumerate")
            shortage.emplace(EMFILE);
    });
    initialize();
    setHook(nullptr);
    ASSERT_TRUE(shortage);
    shortage.reset();
    EXPECT_EQ(names(), (Names{L"Name", L"name", L"third"}));
    EXPECT_FALSE(find(later)->module);
    EXPECT_EQ(find(later)->fileTime, 0u);
    EXPECT_EQ(find(later)->fileSize, 0);
    EXPECT_FALSE(find(changed)->module);
    EXPECT_EQ(find(changed)->fileTime, oldTime);
    EXPECT_FALSE(indexed(countedUid));
    // The next start reads the record that this start would store. It must find both libraries.
    const std::uint32_t time = find(later)->fileTime;
    const int64 size = find(later)->fileSize;
    restart();
    ComponentLibrary& next = record(later, false);
    next.fileTime = time;
    next.fileSize = size;
    record(changed, false).fileTime = oldTime;
    initialize();
    EXPECT_EQ(maker(kitUid), "kit");
    EXPECT_EQ(maker(countedUid), "counted");
}

TEST_F(PosixDiscovery, KeepsNoNoteOfARecordedFileThatItCannotOpenForWantOfDescriptors) {
    const auto file = add(L"goodWithKit", "a.so");
    ComponentLibrary& library = record(file);
    recordBuilder(library, kitUid, L"as recorded");
    initialize();
    const QrBuilderDescription* const held = indexed(kitUid);
    ASSERT_TRUE(held);
    {
        const FailingOpen none(ENOMEM);
        EXPECT_FALSE(manager->getBuilder(kitUid));
    }
    EXPECT_THAT(names(), IsEmpty());
    EXPECT_FALSE(library.module);
    // A record with time and size but without builders would never be read again.
    EXPECT_EQ(library.fileTime, 0u);
    EXPECT_EQ(library.fileSize, 0);
    EXPECT_TRUE(held->getBuilder());
    EXPECT_EQ(names(), (Names{L"kit"}));
}

TEST_F(PosixDiscovery, PassesOverFilesThatMayNotBeRead) {
    const auto file = add(L"goodByHand");
    std::filesystem::permissions(file, std::filesystem::perms::none);
    add(L"goodWithKit", "zz");
    // The superuser can read every file. Switch to another user for this test.
    const uid_t before = ::geteuid();
    if (before == 0) {
        ASSERT_EQ(::seteuid(65534), 0);
    }
    initialize();
    ASSERT_EQ(::seteuid(before), 0);
    EXPECT_FALSE(find(file)->module);
    EXPECT_EQ(names(), (Names{L"kit"}));
}

TEST_F(PosixDiscovery, FindsAFolderThatTheKitNamedUnderTheThreadsLocale) {
    const std::filesystem::path strange = folder.path() / "\xC3\xBC \xE6\x97\xA5";
    std::filesystem::create_directory(strange);
    std::filesystem::copy_file(builtComponent(L"goodWithKit"), strange / "kit.so");
    std::thread([&] {
        const locale_t locale = ::newlocale(LC_ALL_MASK, "C.UTF-8", nullptr);
        ASSERT_TRUE(locale);
        const locale_t before = ::uselocale(locale);
        manager->initialize(Kit::searchPath(strange).c_str());
        ::uselocale(before);
        ::freelocale(locale);
    }).join();
    EXPECT_EQ(names(), (Names{L"kit"}));
    EXPECT_TRUE(manager->libraries.front().directory.view().ends_with(L"\\\u00FC \u65E5"));
}

} // namespace
