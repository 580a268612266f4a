// SPDX-License-Identifier: BSL-1.0
/// Tests the reader of the loader's cache, which must not trust the file.
#include "components/componentTools/platform/posix/loaderCache.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <cstdint>
#include <cstring>
#include <fstream>
#include <iterator>
#include <string>
#include <utility>

using namespace Mz::Tools;
using testing::ElementsAre;
using testing::IsEmpty;
using testing::Pair;

namespace {

constexpr std::int32_t ours = 0x0303;
constexpr std::size_t headerSize = 48, entrySize = 24;

/// Returns a cache with two libraries, the first one of this kind.
std::string cacheWith(std::int32_t flags) {
    std::string content = "glibc-ld.so.cache1.1";
    content.resize(headerSize + 2 * entrySize);
    const auto put = [&](std::size_t offset, std::uint32_t value) {
        std::memcpy(content.data() + offset, &value, sizeof value);
    };
    put(20, 2);
    const auto texts = static_cast<std::uint32_t>(content.size());
    content += std::string("one\0/lib/one\0two\0/lib/two\0", 26);
    const std::uint32_t places[2][2] = {{0, 4}, {13, 17}};
    for (std::size_t index = 0; index < 2; ++index) {
        const std::size_t entry = headerSize + index * entrySize;
        put(entry, static_cast<std::uint32_t>(index == 0 ? flags : ours));
        put(entry + 4, texts + places[index][0]);
        put(entry + 8, texts + places[index][1]);
    }
    return content;
}

TEST(LoaderCache, HasTheLibrariesOfThisProcessor) {
    EXPECT_THAT(System::librariesInLoaderCache(cacheWith(ours)),
                testing::UnorderedElementsAre(Pair("one", "/lib/one"), Pair("two", "/lib/two")));
    EXPECT_THAT(System::librariesInLoaderCache(cacheWith(0x0A03)),
                ElementsAre(Pair("two", "/lib/two")));
    // The offsets count from the mark.
    EXPECT_THAT(System::librariesInLoaderCache("older cache" + cacheWith(0x0A03)),
                ElementsAre(Pair("two", "/lib/two")));
}

TEST(LoaderCache, WithoutAHeaderIsEmpty) {
    const std::string whole = cacheWith(ours);
    for (const std::size_t size :
         {std::size_t{0}, std::size_t{19}, std::size_t{20}, headerSize - 1})
        EXPECT_THAT(System::librariesInLoaderCache(whole.substr(0, size)), IsEmpty()) << size;
    EXPECT_THAT(System::librariesInLoaderCache("another file"), IsEmpty());
}

TEST(LoaderCache, CutOffHasNoTextBehindItsEnd) {
    const std::string whole = cacheWith(ours);
    EXPECT_THAT(System::librariesInLoaderCache(whole.substr(0, headerSize + entrySize - 1)),
                IsEmpty());
    EXPECT_THAT(System::librariesInLoaderCache(whole.substr(0, headerSize + entrySize)),
                ElementsAre(Pair("", "")));
    EXPECT_THAT(System::librariesInLoaderCache(whole.substr(0, whole.size() - 19)),
                testing::UnorderedElementsAre(Pair("one", "/li"), Pair("", "")));
}

} // namespace
