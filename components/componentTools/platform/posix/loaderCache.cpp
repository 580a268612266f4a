// SPDX-License-Identifier: BSL-1.0
/// Reads /etc/ld.so.cache once and indexes it. Running `ldconfig -p` or loading each dependency
/// would be slower, and loading would run initialisers.
#include "components/componentTools/platform/posix/loaderCache.h"

#include <cstdint>
#include <cstring>
#include <fstream>
#include <iterator>
#include <string_view>
#include <utility>

namespace Mz::Tools::System {

namespace {

constexpr std::string_view mark = "glibc-ld.so.cache1.1";

struct Header {
    char mark[20];
    std::uint32_t count, textSize;
    unsigned char flags, padding[3];
    std::uint32_t extension, unused[3];
};

struct Entry {
    std::int32_t flags;
    std::uint32_t name, file, system;
    std::uint64_t hardware;
};

constexpr std::int32_t librariesOfX86_64 = 0x0303;

std::string textAt(const std::string& content, std::size_t offset) {
    if (offset >= content.size())
        return {};
    return content.substr(offset, content.find('\0', offset) - offset);
}

LoaderCache readCache() {
    std::ifstream stream("/etc/ld.so.cache", std::ios::binary);
    return librariesInLoaderCache(std::string(std::istreambuf_iterator<char>(stream), {}));
}

} // namespace

LoaderCache librariesInLoaderCache(const std::string& content) {
    // A cache in the old format may precede the new one.
    const std::size_t start = content.find(mark);
    LoaderCache cache;
    if (start == std::string::npos || content.size() - start < sizeof(Header))
        return cache;
    Header header;
    std::memcpy(&header, content.data() + start, sizeof header);
    std::size_t offset = start + sizeof header;
    for (std::uint32_t index = 0; index < header.count; ++index, offset += sizeof(Entry)) {
        if (content.size() - offset < sizeof(Entry))
            break;
        Entry entry;
        std::memcpy(&entry, content.data() + offset, sizeof entry);
        if (entry.flags == librariesOfX86_64)
            cache.emplace(textAt(content, start + entry.name), textAt(content, start + entry.file));
    }
    return cache;
}

std::optional<std::string> findInLoaderCache(const std::string& name) {
    static const LoaderCache cache = readCache();
    const auto found = cache.find(name);
    if (found == cache.end())
        return std::nullopt;
    return found->second;
}

} // namespace Mz::Tools::System
