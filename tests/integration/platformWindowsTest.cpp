// SPDX-License-Identifier: BSL-1.0
/// Tests what only the Windows platform layer has: the export reader compared with the system's
/// loader, error modes, and the system's table of upper-case letters.
#include "components/platform/platform.h"
#include "components/platform/upperCase.h"
#include "components/platform/windows/exportReader.h"
#include "tests/integration/managerFixture.h"
#include "tests/support/peFile.h"

#include <fstream>
#include <iterator>
#include <windows.h>

using namespace Mz::platform;
using namespace Mz::Test;

/// This program's import table entry for the function.
extern "C" decltype(&::LoadLibraryExW) __imp_LoadLibraryExW;

namespace {

constexpr const char* entryPoint = "QrGetComponentDescription";

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

std::string contentOf(const std::filesystem::path& file) {
    std::ifstream stream(file, std::ios::binary);
    return std::string(std::istreambuf_iterator<char>(stream), {});
}

TEST(WindowsPlatform, FindsNothingInALibraryCutAtAnyLength) {
    TemporaryDirectory folder;
    const std::string whole = contentOf(builtComponent(L"tiny"));
    ASSERT_GT(whole.size(), 1024u);
    ASSERT_TRUE(exportsFunction(builtComponent(L"tiny"), entryPoint));
    const auto file = folder.write("cut.dll", whole);
    for (std::size_t length = whole.size(); length-- > 0;) {
        std::filesystem::resize_file(file, length);
        ASSERT_EQ(readExport(file.native(), entryPoint), ExportState::absent) << length;
    }
}

/// Returns whether the system itself finds the entry point in the file.
bool systemFinds(const std::filesystem::path& file) {
    const HMODULE module = ::LoadLibraryExW(file.c_str(), nullptr, DONT_RESOLVE_DLL_REFERENCES);
    const bool found = findSymbol(module, entryPoint) != nullptr;
    unloadLibrary(module);
    return found;
}

TEST(WindowsPlatform, AgreesWithTheSystemOnEveryTestComponent) {
    int with = 0;
    int without = 0;
    for (const auto& entry :
         std::filesystem::recursive_directory_iterator(buildFolder / "components")) {
        if (!entry.is_regular_file() || entry.path().extension() != ".dll")
            continue;
        const bool found = systemFinds(entry.path());
        EXPECT_EQ(readExport(entry.path().native(), entryPoint),
                  found ? ExportState::exported : ExportState::absent)
            << entry.path();
        ++(found ? with : without);
    }
    EXPECT_GT(with, 20);
    EXPECT_GE(without, 3);
}

TEST(WindowsPlatform, AgreesWithTheSystemOnLibrariesMadeByHand) {
    TemporaryDirectory folder;
    const std::vector<std::vector<PeExport>> tables{
        {{entryPoint, peCode}},
        {{entryPoint, peData}},
        {{entryPoint, 0}},
        {{entryPoint, 0x9000}},
        {{"A", peCode}, {entryPoint, peCode}, {"z", peCode}},
        {{"Q", peCode},
         {"QrGetComponentDescriptio", peCode},
         {"QrGetComponentDescriptions", peCode}},
        {{"z", peCode}, {"y", peCode}, {entryPoint, peCode}}, // Not sorted.
        {{entryPoint, peCode}, {"b", peCode}, {"a", peCode}}};
    int number = 0;
    for (const std::vector<PeExport>& table : tables) {
        const auto file =
            folder.write("made" + std::to_string(++number) + ".dll", madeLibrary(table));
        EXPECT_TRUE(::FreeLibrary(::LoadLibraryW(file.c_str()))) << number;
        EXPECT_EQ(readExport(file.native(), entryPoint) == ExportState::exported, systemFinds(file))
            << number;
    }
}

/// Counts this program's calls that map a library. The system reports a mapping only after it has
/// resolved the dependencies, so this class replaces an entry of the program's import table.
class MappingCounter {
  public:
    MappingCounter() : original(__imp_LoadLibraryExW) {
        calls = 0;
        real = original;
        replace(&count);
    }
    ~MappingCounter() { replace(original); }
    MappingCounter(const MappingCounter&) = delete;
    MappingCounter& operator=(const MappingCounter&) = delete;

    static int calls;

  private:
    using Function = decltype(&::LoadLibraryExW);

    static HMODULE WINAPI count(const wchar_t* name, HANDLE file, DWORD flags) {
        ++calls;
        return real(name, file, flags);
    }
    static void replace(Function function) {
        DWORD before = 0;
        EXPECT_TRUE(
            ::VirtualProtect(&__imp_LoadLibraryExW, sizeof function, PAGE_READWRITE, &before));
        __imp_LoadLibraryExW = function;
        EXPECT_TRUE(::VirtualProtect(&__imp_LoadLibraryExW, sizeof function, before, &before));
    }

    static Function real;
    Function original;
};
int MappingCounter::calls;
MappingCounter::Function MappingCounter::real;

TEST(WindowsPlatform, MapsNothingThatDoesNotExportTheFunction) {
    TemporaryDirectory folder;
    const auto with = folder.write("with.dll", madeLibrary({{entryPoint, peCode}}));
    const auto without = folder.write("without.dll", madeLibrary({{"anotherFunction", peCode}}));
    const auto program =
        buildFolder / "components" / "kitProgram" / L"kitProgram" MZ_PROGRAM_EXTENSION;
    const MappingCounter mappings;
    EXPECT_EQ(queryExport(with.native(), entryPoint), ExportState::exported);
    EXPECT_EQ(mappings.calls, 1);
    for (const std::filesystem::path& file : {without, program}) {
        EXPECT_EQ(queryExport(file.native(), entryPoint), ExportState::absent) << file;
        EXPECT_FALSE(useLibrary(file.native(), entryPoint).module) << file;
    }
    EXPECT_EQ(mappings.calls, 1);
}

TEST(WindowsPlatform, HasTheSystemsTableOfUpperCaseLetters) {
    // Linux uses a copy of the system's table. It must be equal, so that both systems sort alike.
    using Upcase = wchar_t __stdcall(wchar_t);
    const auto upcase = reinterpret_cast<Upcase*>(reinterpret_cast<void*>(
        ::GetProcAddress(::GetModuleHandleW(L"ntdll.dll"), "RtlUpcaseUnicodeChar")));
    ASSERT_TRUE(upcase);
    for (unsigned int unit = 0; unit < 0x10000; ++unit)
        ASSERT_EQ(static_cast<unsigned int>(upperCase(static_cast<char16_t>(unit))),
                  static_cast<unsigned int>(upcase(static_cast<wchar_t>(unit))))
            << std::hex << unit;
}

TEST(WindowsPlatform, KnowsAShortageOfResourcesFromAFaultOfTheFile) {
    for (const DWORD error : {ERROR_TOO_MANY_OPEN_FILES, ERROR_NOT_ENOUGH_MEMORY, ERROR_OUTOFMEMORY,
                              ERROR_NO_SYSTEM_RESOURCES, ERROR_NONPAGED_SYSTEM_RESOURCES,
                              ERROR_PAGED_SYSTEM_RESOURCES, ERROR_WORKING_SET_QUOTA,
                              ERROR_PAGEFILE_QUOTA, ERROR_COMMITMENT_LIMIT, ERROR_NOT_ENOUGH_QUOTA})
        EXPECT_TRUE(isShortage(error)) << error;
    for (const DWORD error :
         {ERROR_SUCCESS, ERROR_FILE_NOT_FOUND, ERROR_PATH_NOT_FOUND, ERROR_ACCESS_DENIED,
          ERROR_SHARING_VIOLATION, ERROR_INVALID_NAME, ERROR_BAD_EXE_FORMAT, ERROR_DISK_FULL})
        EXPECT_FALSE(isShortage(error)) << error;
}

} // namespace
