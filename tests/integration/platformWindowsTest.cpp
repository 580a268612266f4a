/// The platform layer on Windows, where it has something of its own.
#include "components/platform/platform.h"
#include "tests/integration/managerFixture.h"

#include <fstream>
#include <iterator>
#include <windows.h>

using namespace Mz::platform;
using Mz::Test::builtComponent;
using Mz::Test::TemporaryDirectory;

namespace {

UINT errorMode() {
    const UINT mode = ::SetErrorMode(0);
    ::SetErrorMode(mode);
    return mode;
}

TEST(WindowsPlatform, OpensByTheNormalisedName) {
    EXPECT_EQ(openingPath(L"c:\\a", L"b", L"C:/A/B"), L"c:\\a\\b");
    EXPECT_EQ(openingPath(L"c:\\a", L"", L"C:/A"), L"c:\\a");
}

TEST(WindowsPlatform, KeepsDialogsAwayAndRestoresTheErrorMode) {
    ::SetErrorMode(SEM_NOGPFAULTERRORBOX);
    {
        const QuietErrors quiet;
        EXPECT_EQ(errorMode(), 0x8001u);
        {
            const QuietErrors inner;
            EXPECT_EQ(errorMode(), 0x8001u);
        }
        EXPECT_EQ(errorMode(), 0x8001u);
    }
    EXPECT_EQ(errorMode(), static_cast<UINT>(SEM_NOGPFAULTERRORBOX));
}

TEST(WindowsPlatform, TakesANameWithoutExtensionForWhatItIs) {
    TemporaryDirectory folder;
    folder.write("name", "text");
    std::filesystem::copy_file(builtComponent(L"goodByHand"), folder.path() / "name.dll");
    EXPECT_FALSE(exportsFunction(folder.path() / "name", "QrGetComponentDescription"));
    EXPECT_FALSE(loadLibrary(folder.path() / "name"));
    const Module module = loadLibrary(folder.path() / "name.dll");
    ASSERT_TRUE(module);
    EXPECT_FALSE(findLoadedLibrary(folder.path() / "name"));
    EXPECT_EQ(findLoadedLibrary(folder.path() / "name.dll"), module);
    unloadLibrary(module);
}

TEST(WindowsPlatform, FindsALoadedLibraryWithoutExtension) {
    TemporaryDirectory folder;
    std::filesystem::copy_file(builtComponent(L"goodByHand"), folder.path() / "name");
    const Module module = loadLibrary(folder.path() / "name");
    ASSERT_TRUE(module);
    EXPECT_EQ(findLoadedLibrary(folder.path() / "name"), module);
    unloadLibrary(module);
}

TEST(WindowsPlatform, ConvertsEveryNameToANativeOne) {
    const std::wstring name = L"\u4E2D\xD800 \u00E4";
    ASSERT_TRUE(toNative(name));
    EXPECT_EQ(*toNative(name), name);
}

TEST(WindowsPlatform, FindsNothingInALibraryCutAtEveryLengthOfItsHeadersAndManyBeyond) {
    TemporaryDirectory folder;
    std::ifstream stream(builtComponent(L"tiny"), std::ios::binary);
    const std::string whole(std::istreambuf_iterator<char>(stream), {});
    ASSERT_GT(whole.size(), 1024u);
    ASSERT_TRUE(exportsFunction(builtComponent(L"tiny"), "QrGetComponentDescription"));
    for (std::size_t length = 0; length < whole.size(); length += length < 1024 ? 16 : 97) {
        const auto file = folder.write("cut.dll", whole.substr(0, length));
        // What the system maps in spite of the cut must at least not be damaged where it counts.
        if (const Module module = loadLibrary(file)) {
            EXPECT_TRUE(findSymbol(module, "QrGetComponentDescription")) << length;
            unloadLibrary(module);
        }
    }
}

} // namespace
