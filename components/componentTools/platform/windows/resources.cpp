// SPDX-License-Identifier: BSL-1.0
/// The heap is walked block by block, because the system has no statistics of it. Handles are
/// tried one by one, because Wine does not count them.
#include "components/componentTools/platform/resources.h"

#include "components/componentTools/platform/system.h"

#include <clocale>
#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <io.h>
#include <malloc.h>
#include <vector>
#include <windows.h>

#include <tlhelp32.h>

namespace Mz::Tools::System {

std::size_t heapInUse() {
    std::size_t bytes = 0;
    _HEAPINFO entry{};
    while (::_heapwalk(&entry) == _HEAPOK)
        if (entry._useflag == _USEDENTRY)
            bytes += entry._size;
    return bytes;
}

std::size_t threadCount() {
    const HANDLE threads = ::CreateToolhelp32Snapshot(TH32CS_SNAPTHREAD, 0);
    THREADENTRY32 entry{};
    entry.dwSize = sizeof entry;
    std::size_t count = 0;
    for (BOOL more = ::Thread32First(threads, &entry); more; more = ::Thread32Next(threads, &entry))
        count += entry.th32OwnerProcessID == ::GetCurrentProcessId();
    ::CloseHandle(threads);
    return count;
}

std::size_t openFileCount() {
    // Handles are multiples of four, and the lowest free one is used.
    constexpr std::uintptr_t step = 4, end = 16384;
    std::size_t count = 0;
    DWORD flags = 0;
    for (std::uintptr_t handle = step; handle < end; handle += step)
        count += ::GetHandleInformation(reinterpret_cast<HANDLE>(handle), &flags) != 0;
    return count;
}

void holdLibraries(const std::vector<std::string>& names) {
    HMODULE ignored = nullptr;
    for (const std::string& name : names)
        ::GetModuleHandleExA(0, name.c_str(), &ignored);
}

void fillNewMemory(unsigned char pattern) {
    // Every second block stays in use until the next call: free blocks side by side would become
    // one large block, from whose other end the heap takes new ones.
    static std::vector<void*>& kept = *new std::vector<void*>;
    for (void* block : kept)
        std::free(block);
    kept.clear();
    std::vector<void*> freed;
    for (std::size_t size = 16; size <= 1024; size += 16)
        for (int copy = 0; copy < 64; ++copy)
            if (void* block = std::malloc(size)) {
                std::memset(block, pattern, size);
                (copy % 2 ? freed : kept).push_back(block);
            }
    for (void* block : freed)
        std::free(block);
}

void closeStandardInput() {
    ::_close(0);
    ::SetStdHandle(STD_INPUT_HANDLE, nullptr);
}

bool useDecimalComma() {
    for (const char* name : {"de-DE", "German_Germany.1252", "fr-FR", "German"})
        if (std::setlocale(LC_NUMERIC, name))
            return true;
    return false;
}

std::wstring processSettings() {
    std::error_code failure;
    return L"folder " + displayName(std::filesystem::current_path(failure)) + L", locale " +
           displayName(std::setlocale(LC_ALL, nullptr));
}

} // namespace Mz::Tools::System
