// SPDX-License-Identifier: BSL-1.0
// The calls of POSIX. Hidden files are skipped.
#include "byHand.h"

#include <cstring>
#include <dirent.h>
#include <dlfcn.h>
#include <elf.h>
#include <fcntl.h>
#include <fstream>
#include <iterator>
#include <sys/stat.h>
#include <unistd.h>

namespace Mz::Benchmarks {

namespace {

/// Calls `action(folder's descriptor, name)` for each file whose status is known. Returns how often
/// the result was true.
template <class Action>
long countFiles(const std::filesystem::path& folder, const Action& action) {
    long count = 0;
    DIR* const listing = ::opendir(folder.c_str());
    while (const dirent* entry = listing ? ::readdir(listing) : nullptr) {
        struct stat status;
        if (entry->d_name[0] != '.' && ::fstatat(::dirfd(listing), entry->d_name, &status, 0) == 0)
            count += action(::dirfd(listing), entry->d_name);
    }
    if (listing)
        ::closedir(listing);
    return count;
}

} // namespace

std::string loadingCalls() {
    return "dlopen, dlsym and call";
}

void* openLibrary(const std::filesystem::path& file) {
    return ::dlopen(file.c_str(), RTLD_NOW | RTLD_LOCAL);
}

void* functionOf(void* library, const char* name) {
    return ::dlsym(library, name);
}

bool loadedFrom(const std::filesystem::path& folder) {
    std::ifstream maps("/proc/self/maps");
    const std::string content(std::istreambuf_iterator<char>(maps), {});
    return content.find(folder.string()) != std::string::npos;
}

long statusOfEach(const std::filesystem::path& folder) {
    return countFiles(folder, [](int, const char*) { return true; });
}

std::uint64_t nameTableOf(const std::filesystem::path& file) {
    std::ifstream stream(file, std::ios::binary);
    const std::string content(std::istreambuf_iterator<char>(stream), {});
    Elf64_Ehdr header{};
    if (content.size() < sizeof header)
        return 0;
    std::memcpy(&header, content.data(), sizeof header);
    for (std::size_t index = 0; index < header.e_shnum; ++index) {
        Elf64_Shdr section{};
        const std::size_t offset = header.e_shoff + index * sizeof section;
        if (offset + sizeof section > content.size())
            break;
        std::memcpy(&section, content.data() + offset, sizeof section);
        if (section.sh_type == SHT_DYNSYM)
            return section.sh_offset;
    }
    return 0;
}

long readBlocksOfEach(const std::filesystem::path& folder, std::uint64_t offset) {
    return countFiles(folder, [offset](int listing, const char* name) {
        char block[1024];
        const int file = ::openat(listing, name, O_RDONLY | O_CLOEXEC);
        const bool read = ::pread(file, block, sizeof block, 0) > 0 &&
                          ::pread(file, block, sizeof block, static_cast<off_t>(offset)) > 0;
        ::close(file);
        return read;
    });
}

} // namespace Mz::Benchmarks
