// SPDX-License-Identifier: BSL-1.0
/// Tests discovery with what only Windows has: file attributes, manifests and forwarded exports.
#include "tests/integration/managerFixture.h"
#include "tests/support/peFile.h"

#include <fstream>
#include <iterator>
#include <windows.h>

using namespace Mz;
using namespace Mz::Test;
using ::testing::IsEmpty;

namespace {

class WindowsDiscovery : public ManagerTest {
  protected:
    static std::string contentOf(const std::filesystem::path& file) {
        std::ifstream stream(file, std::ios::binary);
        return std::string(std::istreambuf_iterator<char>(stream), {});
    }
};

TEST_F(WindowsDiscovery, LeavesOutHiddenAndSystemFiles) {
    const auto hidden = add(L"goodByHand", "hidden.dll");
    const auto system = add(L"countedDescription", "system.dll");
    ASSERT_TRUE(::SetFileAttributesW(hidden.c_str(), FILE_ATTRIBUTE_HIDDEN));
    ASSERT_TRUE(::SetFileAttributesW(system.c_str(), FILE_ATTRIBUTE_SYSTEM));
    ASSERT_EQ(::GetFileAttributesW(hidden.c_str()) & FILE_ATTRIBUTE_HIDDEN,
              static_cast<DWORD>(FILE_ATTRIBUTE_HIDDEN));
    ASSERT_EQ(::GetFileAttributesW(system.c_str()) & FILE_ATTRIBUTE_SYSTEM,
              static_cast<DWORD>(FILE_ATTRIBUTE_SYSTEM));
    add(L"goodWithKit");
    initialize();
    EXPECT_EQ(names(), (Names{L"kit"}));
    EXPECT_EQ(manager->libraries.size(), 1u);
    ::SetFileAttributesW(hidden.c_str(), FILE_ATTRIBUTE_NORMAL);
    ::SetFileAttributesW(system.c_str(), FILE_ATTRIBUTE_NORMAL);
}

TEST_F(WindowsDiscovery, TakesReadOnlyFiles) {
    const auto file = add(L"goodByHand");
    ASSERT_TRUE(::SetFileAttributesW(file.c_str(), FILE_ATTRIBUTE_READONLY));
    initialize();
    EXPECT_EQ(maker(goodUid), "good");
    manager.reset();
    ::SetFileAttributesW(file.c_str(), FILE_ATTRIBUTE_NORMAL);
}

TEST_F(WindowsDiscovery, LoadsALibraryInTheSurroundingsOfItsOwnManifest) {
    // noManifest.dll, the same library without a manifest, shows that its dependency is not found
    // otherwise.
    manager->initialize(searchPathOf(buildFolder / "components" / "ownManifest").c_str());
    EXPECT_EQ(names(), (Names{L"manifest"}));
    ASSERT_TRUE(find("ownManifest.dll"));
    EXPECT_TRUE(find("ownManifest.dll")->module);
    ASSERT_TRUE(find("noManifest.dll"));
    EXPECT_FALSE(find("noManifest.dll")->module);
    ASSERT_TRUE(indexed(manifestUid));
    EXPECT_EQ(indexed(manifestUid)->getNumber(), 1234u);
    EXPECT_EQ(maker(manifestUid), "manifest");
}

TEST_F(WindowsDiscovery, LoadsALibraryInTheSurroundingsOfItsOwnManifestOnFirstUseToo) {
    const auto file = buildFolder / "components" / "ownManifest" / "ownManifest.dll";
    recordBuilder(record(file), manifestUid, L"as recorded");
    manager->initialize(searchPathOf(file.parent_path()).c_str());
    EXPECT_FALSE(isMapped(file));
    EXPECT_EQ(maker(manifestUid), "manifest");
}

TEST_F(WindowsDiscovery, LoadsALibraryInTheSurroundingsOfAManifestBesideIt) {
    // The loader itself heeds a manifest in the library, but not this one.
    std::filesystem::copy(buildFolder / "components" / "ownManifest", folder.path(),
                          std::filesystem::copy_options::recursive);
    std::ofstream(folder.path() / "noManifest.dll.2.manifest")
        << R"(<assembly xmlns="urn:schemas-microsoft-com:asm.v1" manifestVersion="1.0">
  <dependency>
    <dependentAssembly>
      <assemblyIdentity type="win32" name="mzTestAssembly" version="1.0.0.0" processorArchitecture="amd64"/>
    </dependentAssembly>
  </dependency>
</assembly>)";
    initialize();
    ASSERT_TRUE(find("noManifest.dll"));
    EXPECT_TRUE(find("noManifest.dll")->module);
}

TEST_F(WindowsDiscovery, LeavesNoActivationContextBehind) {
    HANDLE before = nullptr;
    ASSERT_TRUE(::GetCurrentActCtx(&before));
    manager->initialize(searchPathOf(buildFolder / "components" / "ownManifest").c_str());
    HANDLE after = nullptr;
    ASSERT_TRUE(::GetCurrentActCtx(&after));
    EXPECT_EQ(before, after);
}

TEST_F(WindowsDiscovery, DoesNotTakeAForwardedEntryPointForTheLibrarysOwn) {
    const auto file = add(L"forwardsEntryPoint");
    initialize();
    EXPECT_THAT(names(), IsEmpty());
    EXPECT_EQ(noted("entry"), 0);
    EXPECT_FALSE(isMapped(file));
}

TEST_F(WindowsDiscovery, DoesNotTakeAForwardedEntryPointThoughTheHostLoadedTheLibrary) {
    void* const host = loadAsHost(add(L"forwardsEntryPoint"));
    ASSERT_TRUE(host);
    initialize();
    EXPECT_THAT(names(), IsEmpty());
    EXPECT_EQ(noted("entry"), 0);
    manager.reset();
    unloadAsHost(host);
}

TEST_F(WindowsDiscovery, ContainsAnInitialiserThatThrows) {
    const auto file = add(L"throwsInInitialiser");
    add(L"goodWithKit", "zz.dll");
    initialize();
    EXPECT_EQ(names(), (Names{L"kit"}));
    EXPECT_EQ(maker(kitUid), "kit");
    EXPECT_FALSE(isMapped(file));
    EXPECT_EQ(find(file)->fileTime, platform::queryFile(file)->time);
}

TEST_F(WindowsDiscovery, DoesNotCallDataNamedLikeTheEntryPoint) {
    const auto file = add(L"dataEntryPoint");
    initialize();
    EXPECT_THAT(names(), IsEmpty());
    EXPECT_FALSE(isMapped(file));
}

TEST_F(WindowsDiscovery, PassesOverLibrariesWithADamagedExportDirectory) {
    const std::string whole = contentOf(builtComponent(L"goodByHand"));
    const std::size_t exports = exportsOf(whole);
    ASSERT_GT(exports, 0u);
    const auto damage = [&](const char* name, std::size_t field, std::uint32_t value) {
        folder.write(name, changedAt(whole, exports + field, value));
    };
    damage("names.dll", PeField::names, 0xFF0000);
    damage("functions.dll", PeField::functions, 0xFF0000);
    damage("ordinals.dll", PeField::ordinals, 0xFF0000);
    damage("count.dll", PeField::nameCount, 0x1000000);
    damage("functionCount.dll", PeField::functionCount, 0x1000000);
    folder.write("directory.dll",
                 changedAt(whole, headerOf(whole) + PeField::exportAddress, 0xFF0000u));
    add(L"goodWithKit", "zz.dll");
    initialize();
    EXPECT_EQ(names(), (Names{L"kit"}));
    EXPECT_EQ(manager->libraries.size(), 7u);
    for (const ComponentLibrary& library : manager->libraries)
        EXPECT_EQ(library.fileTime, platform::queryFile(library.openingPath())->time)
            << library.fileName.c_str();
}

TEST_F(WindowsDiscovery, PassesOverALibraryOf32Bits) {
    std::string content = madeLibrary({{"QrGetComponentDescription", peCode}});
    putAt(content, headerOf(content) + PeField::machine, std::uint16_t{0x14C});
    putAt(content, headerOf(content) + PeField::magic, std::uint16_t{0x10B});
    const auto file = folder.write("narrow.dll", content);
    initialize();
    EXPECT_FALSE(find(file)->module);
    EXPECT_EQ(find(file)->fileTime, platform::queryFile(file)->time);
}

TEST_F(WindowsDiscovery, UsesTheProgramOfTheHostWhereItLiesInTheSearchPath) {
    // A mapped module is used without a check of its exports: the program exports no entry point.
    std::wstring name(MAX_PATH, L'\0');
    name.resize(::GetModuleFileNameW(nullptr, name.data(), MAX_PATH));
    const std::filesystem::path program(name);
    const platform::UsedLibrary used = platform::useLibrary(program.native(), "noSuchFunction");
    EXPECT_EQ(used.module, ::GetModuleHandleW(nullptr));
    EXPECT_FALSE(used.loaded);
}

TEST_F(WindowsDiscovery, TakesTheLaterOfTwoRecordsOfOneFile) {
    const auto file = add(L"goodByHand");
    recordBuilder(record(file), goodUid, L"first");
    recordBuilder(record(file), goodUid, L"second");
    add(L"goodWithKit", "zz");
    initialize();
    EXPECT_EQ(manager->libraries.size(), 2u);
    EXPECT_EQ(names(), (Names{L"second", L"kit"}));
    EXPECT_EQ(maker(goodUid), "good");
}

TEST_F(WindowsDiscovery, RestoresTheErrorMode) {
    const UINT before = ::SetErrorMode(SEM_NOGPFAULTERRORBOX);
    folder.write("text.dll", "no library");
    add(L"goodByHand");
    initialize();
    EXPECT_EQ(::SetErrorMode(before), static_cast<UINT>(SEM_NOGPFAULTERRORBOX));
}

TEST_F(WindowsDiscovery, FindsLibrariesByNonAsciiNames) {
    add(L"goodByHand", L"caf\u00E9 \u4E2D.dll");
    initialize();
    EXPECT_EQ(maker(goodUid), "good");
    ASSERT_EQ(manager->libraries.size(), 1u);
    EXPECT_EQ(manager->libraries.front().fileName, L"caf\u00E9 \u4E2D.dll");
}

TEST_F(WindowsDiscovery, MakesOneRecordOfAFolderNamedInTwoLetterCases) {
    add(L"goodByHand");
    std::wstring upper = searchPathOf(folder.path());
    for (wchar_t& c : upper)
        c = static_cast<wchar_t>(::towupper(c));
    manager->initialize((searchPathOf(folder.path()) + L";" + upper).c_str());
    EXPECT_EQ(manager->libraries.size(), 1u);
    EXPECT_EQ(names(), (Names{L"Name", L"name", L"third"}));
}

} // namespace
