// SPDX-License-Identifier: BSL-1.0
/// Counts are read from /proc, and the heap is asked for its statistics.
#include "components/componentTools/platform/resources.h"

#include "components/componentTools/platform/system.h"

#include <array>
#include <clocale>
#include <cstdlib>
#include <dlfcn.h>
#include <iterator>
#include <malloc.h>
#include <unistd.h>

/// Defined by the sanitizers, which replace the heap.
// NOLINTNEXTLINE(bugprone-reserved-identifier)
extern "C" __attribute__((weak)) std::size_t __sanitizer_get_current_allocated_bytes();

namespace Mz::Tools::System {

namespace {

std::size_t entriesOf(const char* folder) {
    std::error_code failure;
    const std::filesystem::directory_iterator entries(folder, failure);
    return failure ? 0
                   : static_cast<std::size_t>(
                         std::distance(begin(entries), std::filesystem::directory_iterator()));
}

} // namespace

std::size_t heapInUse() {
    if (__sanitizer_get_current_allocated_bytes)
        return 0;
    const struct mallinfo2 heap = ::mallinfo2();
    return heap.uordblks + heap.hblkhd;
}

std::size_t threadCount() {
    return entriesOf("/proc/self/task");
}

std::size_t openFileCount() {
    return entriesOf("/proc/self/fd");
}

void holdLibraries(const std::vector<std::string>& names) {
    for (const std::string& name : names)
        if (!::dlopen(name.c_str(), RTLD_LAZY | RTLD_NOLOAD))
            ::dlerror(); // Discards the message.
}

void fillNewMemory(unsigned char pattern) {
    ::mallopt(M_PERTURB, pattern);
    // glibc does not fill the small blocks that a thread frees and takes again.
    constexpr std::size_t largest = 1024, copies = 8;
    std::array<void*, copies> blocks;
    for (std::size_t size = 16; size <= largest; size += 16) {
        for (void*& block : blocks) {
            block = std::malloc(size);
            // The compiler leaves out what it sees to be written before a block is freed.
            auto* const bytes = static_cast<volatile unsigned char*>(block);
            for (std::size_t index = 0; block && index < size; ++index)
                bytes[index] = pattern;
        }
        for (void* block : blocks)
            std::free(block);
    }
}

void closeStandardInput() {
    ::close(STDIN_FILENO);
}

bool useDecimalComma() {
    for (const char* name : {"de_DE.UTF-8", "de_DE.utf8", "fr_FR.UTF-8", "es_ES.UTF-8", "de_DE",
                             "de_DE.ISO-8859-15", "pl_PL.UTF-8", "ru_RU.UTF-8"})
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
