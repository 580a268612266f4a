// SPDX-License-Identifier: BSL-1.0
// The calls of Windows. Folders are skipped.
#include "byHand.h"

#include <cstring>
#include <fstream>
#include <io.h>
#include <iterator>
#include <sys/stat.h>
#include <windows.h>

namespace Mz::Benchmarks {

namespace {

/// Calls `action(path)` for each file whose status is known. Returns how often the result was true.
template <class Action>
long countFiles(const std::filesystem::path& folder, const Action& action) {
    long count = 0;
    _wfinddata64i32_t entry{};
    const std::intptr_t listing = ::_wfindfirst64i32((folder / L"*").c_str(), &entry);
    for (bool found = listing != -1; found; found = ::_wfindnext64i32(listing, &entry) == 0) {
        const std::wstring path = folder.native() + L'\\' + entry.name;
        struct _stat64 status;
        if (!(entry.attrib & _A_SUBDIR) && ::_wstat64(path.c_str(), &status) == 0)
            count += action(path);
    }
    if (listing != -1)
        ::_findclose(listing);
    return count;
}

bool readsAt(HANDLE file, std::uint64_t offset) {
    char block[1024];
    OVERLAPPED position{};
    position.Offset = static_cast<DWORD>(offset);
    DWORD done = 0;
    return ::ReadFile(file, block, sizeof block, &done, &position) && done > 0;
}

/// Returns the `T` at an offset in the bytes of a file; zeros where there are none.
template <class T>
T at(const std::string& content, std::size_t offset) {
    T value{};
    if (offset <= content.size() && content.size() - offset >= sizeof value)
        std::memcpy(&value, content.data() + offset, sizeof value);
    return value;
}

} // namespace

std::string loadingCalls() {
    return "LoadLibraryExW, GetProcAddress and call";
}

void* openLibrary(const std::filesystem::path& file) {
    return ::LoadLibraryExW(file.c_str(), nullptr, 0);
}

void* functionOf(void* library, const char* name) {
    return reinterpret_cast<void*>(::GetProcAddress(static_cast<HMODULE>(library), name));
}

bool loadedFrom(const std::filesystem::path& folder) {
    for (const auto& entry : std::filesystem::directory_iterator(folder))
        if (::GetModuleHandleW(entry.path().c_str()))
            return true;
    return false;
}

long statusOfEach(const std::filesystem::path& folder) {
    return countFiles(folder, [](const std::wstring&) { return true; });
}

std::uint64_t nameTableOf(const std::filesystem::path& file) {
    std::ifstream stream(file, std::ios::binary);
    const std::string content(std::istreambuf_iterator<char>(stream), {});
    const auto start = static_cast<std::size_t>(at<IMAGE_DOS_HEADER>(content, 0).e_lfanew);
    const auto headers = at<IMAGE_NT_HEADERS64>(content, start);
    const DWORD table =
        headers.OptionalHeader.DataDirectory[IMAGE_DIRECTORY_ENTRY_EXPORT].VirtualAddress;
    std::size_t offset = start + FIELD_OFFSET(IMAGE_NT_HEADERS64, OptionalHeader) +
                         headers.FileHeader.SizeOfOptionalHeader;
    for (WORD index = 0; index < headers.FileHeader.NumberOfSections; ++index) {
        const auto section = at<IMAGE_SECTION_HEADER>(content, offset);
        if (table >= section.VirtualAddress &&
            table - section.VirtualAddress < section.SizeOfRawData)
            return section.PointerToRawData + std::uint64_t{table - section.VirtualAddress};
        offset += sizeof section;
    }
    return 0;
}

long readBlocksOfEach(const std::filesystem::path& folder, std::uint64_t offset) {
    return countFiles(folder, [offset](const std::wstring& path) {
        constexpr DWORD sharing = FILE_SHARE_READ | FILE_SHARE_WRITE | FILE_SHARE_DELETE;
        HANDLE const file = ::CreateFileW(path.c_str(), GENERIC_READ, sharing, nullptr,
                                          OPEN_EXISTING, FILE_ATTRIBUTE_NORMAL, nullptr);
        const bool read = readsAt(file, 0) && readsAt(file, offset);
        ::CloseHandle(file);
        return read;
    });
}

} // namespace Mz::Benchmarks
