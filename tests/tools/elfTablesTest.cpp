// SPDX-License-Identifier: BSL-1.0
// The tables to which the dynamic section of an ELF library leads: one of them missing, names at
// the end of the table of names, and both kinds of hash table.
#include "tests/tools/images.h"

#include "components/componentTools/images/libraryImage.h"
#include "tests/support/temporaryDirectory.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <cstdint>
#include <cstring>
#include <set>
#include <string>
#include <vector>

using namespace Mz::Tools;
using namespace Mz::Test;
using testing::ElementsAre;

namespace {

constexpr std::uint64_t neededTag = 1, hashTag = 4, stringsTag = 5, symbolsTag = 6,
                        stringsSizeTag = 10, ownNameTag = 14, oldFolderTag = 15, folderTag = 29,
                        gnuHashTag = 0x6FFFFEF5, programTag = 0x6FFFFFFB, ignoredTag = 0x60000000;

const std::string entryPoint = "QrGetComponentDescription";

/// The hash of the older kind of hash table, step by step as its description has it.
std::uint32_t oldHash(const std::string& name) {
    std::uint32_t hash = 0;
    for (const char c : name) {
        hash = (hash << 4) + static_cast<unsigned char>(c);
        const std::uint32_t high = hash & 0xF0000000;
        if (high != 0)
            hash ^= high >> 24;
        hash &= ~high;
    }
    return hash;
}

class ElfTables : public testing::Test {
  protected:
    template <class T>
    T get(std::size_t offset) const {
        T value;
        std::memcpy(&value, bytes.data() + offset, sizeof value);
        return value;
    }
    template <class T>
    void put(std::size_t offset, T value) {
        std::memcpy(bytes.data() + offset, &value, sizeof value);
    }

    /// Returns the offset of the first entry of the dynamic section with this tag.
    std::size_t entryOf(std::uint64_t tag) const {
        std::size_t entry = 0x200;
        while (get<std::uint64_t>(entry) != tag)
            entry += 16;
        return entry;
    }
    void setTag(std::uint64_t tag, std::uint64_t changed) { put(entryOf(tag), changed); }
    void setValue(std::uint64_t tag, std::uint64_t value) { put(entryOf(tag) + 8, value); }
    std::uint64_t value(std::uint64_t tag) const { return get<std::uint64_t>(entryOf(tag) + 8); }

    /// Replaces the hash table by one of the older kind with these words.
    void setOldHash(const std::vector<std::uint32_t>& words) {
        if (!isOldHash) // The first call.
            setTag(gnuHashTag, hashTag);
        isOldHash = true;
        for (std::size_t index = 0; index < words.size(); ++index)
            put(value(hashTag) + index * 4, words[index]);
    }

    /// As above, with one symbol, in the right one of `buckets` buckets.
    void setOldHash(std::uint32_t buckets, std::uint32_t shift = 0) {
        std::vector<std::uint32_t> words{buckets, 2};
        words.resize(2 + buckets + 2, 0);
        words[2 + (oldHash(entryPoint) + shift) % buckets] = 1;
        setOldHash(words);
    }

    std::filesystem::path file() const { return folder.write("image", bytes); }
    LibraryImage read() const { return readLibraryImage(file()); }
    bool hasEntryPoint() const { return read().entryPoint == LibraryImage::EntryPoint::function; }

    /// Starts again with a whole library.
    void restart(const ImageTraits& traits = {}) {
        bytes = elfLibrary(traits);
        isOldHash = false;
    }

    std::string bytes = elfLibrary({});
    bool isOldHash = false;
    TemporaryDirectory folder;
};

TEST_F(ElfTables, AreAllNeeded) {
    const std::string whole = bytes;
    for (const std::uint64_t tag : {symbolsTag, stringsTag, gnuHashTag}) {
        bytes = whole;
        setTag(tag, ignoredTag);
        const LibraryImage image = read();
        EXPECT_EQ(image.damage, L"it has no table of symbols") << tag;
        EXPECT_EQ(image.entryPoint, LibraryImage::EntryPoint::absent) << tag;
        std::set<std::string> names{entryPoint};
        EXPECT_FALSE(removeDefined(file(), names)) << tag;
        EXPECT_THAT(names, ElementsAre(entryPoint));
    }
}

TEST_F(ElfTables, OfSymbolsAndNamesAreNeededForSymbols) {
    put<std::uint32_t>(value(gnuHashTag) + 4, 2); // Symbol 1 may now be undefined.
    put<std::uint16_t>(value(symbolsTag) + 30, 0);
    EXPECT_THAT(wantedSymbols(file()), ElementsAre(entryPoint));
    const std::string whole = bytes;
    for (const std::uint64_t tag : {symbolsTag, stringsTag, gnuHashTag}) {
        bytes = whole;
        setTag(tag, ignoredTag);
        EXPECT_TRUE(wantedSymbols(file()).empty()) << tag;
    }
}

TEST_F(ElfTables, ThatAreMissingAreNotLookedForInTheHeader) {
    restart({.program = true}); // For programs, no missing table is reported.
    // Where symbol 1 of a table at address 0 would be, there is the address of the first statement.
    const std::uint64_t name = get<std::uint32_t>(value(symbolsTag) + 24), type = 0x12;
    put(24, name | type << 32);
    setTag(symbolsTag, ignoredTag);
    put<std::uint32_t>(value(gnuHashTag) + 4, 2);
    EXPECT_TRUE(wantedSymbols(file()).empty());

    constexpr std::uint64_t firstSection = std::uint64_t{1} << 48;
    put(24, name | type << 32 | firstSection);
    put<std::uint32_t>(value(gnuHashTag) + 4, 1);
    std::set<std::string> names{entryPoint};
    EXPECT_TRUE(removeDefined(file(), names));
    EXPECT_THAT(names, ElementsAre(entryPoint));
}

TEST_F(ElfTables, HoldANameUpToTheirLastByte) {
    const std::uint64_t size = value(stringsSizeTag);
    setValue(neededTag, size - 1);
    EXPECT_THAT(read().needed, ElementsAre("", "second.lib"));
    setValue(neededTag, size - 2);
    EXPECT_THAT(read().needed, ElementsAre("n", "second.lib"));
    setValue(neededTag, size);
    EXPECT_EQ(read().damage, L"the name of a library that it needs is missing");
    EXPECT_TRUE(read().needed.empty());
}

TEST_F(ElfTables, HoldTheFoldersOfDependencies) {
    for (const std::uint64_t tag : {folderTag, oldFolderTag}) {
        restart();
        setTag(neededTag, tag);
        LibraryImage image = read();
        EXPECT_EQ(image.damage, L"") << tag;
        EXPECT_THAT(tag == folderTag ? image.runpath : image.rpath, ElementsAre("first.lib"));
        EXPECT_THAT(image.needed, ElementsAre("second.lib"));
        setValue(tag, value(stringsSizeTag));
        image = read();
        EXPECT_EQ(image.damage, L"the name of a library that it needs is missing") << tag;
    }
}

TEST_F(ElfTables, ThatAreCutOffByTheEndOfTheFileNameNoExports) {
    EXPECT_THAT(exportedNames(file()), ElementsAre(entryPoint));
    for (const std::uint64_t left : {4u, 8u, 12u}) { // Of the head of the table.
        setValue(gnuHashTag, elfPlaces.fileEnd - left);
        EXPECT_THAT(exportedNames(file()), testing::IsEmpty()) << left;
    }
}

TEST_F(ElfTables, HoldTheOwnName) {
    const std::uint64_t size = value(stringsSizeTag);
    setTag(programTag, ownNameTag);
    setValue(ownNameTag, 1);
    EXPECT_EQ(read().ownName, "first.lib");
    setValue(ownNameTag, size - 1);
    EXPECT_EQ(read().ownName, "");
    EXPECT_TRUE(hasEntryPoint());
    setValue(ownNameTag, size);
    EXPECT_EQ(read().damage, L"its table of names has no end");
}

TEST_F(ElfTables, MayBeOfTheOlderKindAlone) {
    for (const std::uint32_t buckets : {1U, 2U, 3U, 5U, 7U}) {
        restart();
        setOldHash(buckets);
        EXPECT_TRUE(hasEntryPoint()) << buckets;
        EXPECT_EQ(read().damage, L"");
        std::set<std::string> names{entryPoint, "other"};
        EXPECT_TRUE(removeDefined(file(), names));
        EXPECT_THAT(names, ElementsAre("other"));
        if (buckets == 1)
            continue;
        restart();
        setOldHash(buckets, 1);
        EXPECT_FALSE(hasEntryPoint()) << "the symbol is in the wrong one of " << buckets;
    }
}

TEST_F(ElfTables, OfTheOlderKindHaveChains) {
    restart({.stamp = Mz::ComponentStamp{}});
    setOldHash({1, 3, 2, 0, 0, 1}); // The bucket begins with symbol 2, which symbol 1 follows.
    EXPECT_TRUE(hasEntryPoint());
    setOldHash({1, 3, 2, 0, 0, 2}); // Symbol 2 follows itself.
    EXPECT_FALSE(hasEntryPoint());
    setOldHash({1, 3, 0, 1, 0, 0}); // There is nothing in the bucket, whatever follows.
    EXPECT_FALSE(hasEntryPoint());
    setOldHash({0, 3, 1, 0, 0, 0}); // There is no bucket.
    EXPECT_FALSE(hasEntryPoint());
    EXPECT_EQ(read().damage, L"");
}

TEST_F(ElfTables, OfTheOlderKindCountTheSymbols) {
    put<std::uint16_t>(value(symbolsTag) + 30, 0); // Symbol 1 is not defined.
    setOldHash({1, 2, 1, 0, 0});
    EXPECT_THAT(wantedSymbols(file()), ElementsAre(entryPoint));
    setOldHash({1, 1, 1, 0, 0});
    EXPECT_TRUE(wantedSymbols(file()).empty());
}

TEST_F(ElfTables, OfTheOlderKindMayLeadNowhere) {
    setOldHash({1, 2, 0xFFFF, 0, 0}); // To a symbol behind the end of the file.
    EXPECT_FALSE(hasEntryPoint());
    setValue(hashTag, elfPlaces.memoryEnd);
    EXPECT_FALSE(hasEntryPoint());
    EXPECT_THAT(exportedNames(file()), testing::IsEmpty());
}

TEST_F(ElfTables, NameNoSymbolThatOthersCannotUse) {
    const std::size_t symbol = value(symbolsTag) + 24;
    const auto isExported = [&](unsigned char info, unsigned char visibility) {
        put(symbol + 4, info);
        put(symbol + 5, visibility);
        return !exportedNames(file()).empty();
    };
    constexpr unsigned char local = 0x02, global = 0x12, weak = 0x22;
    constexpr unsigned char internal = 1, hidden = 2, protectedToo = 3;
    EXPECT_TRUE(isExported(global, 0));
    EXPECT_TRUE(isExported(global, protectedToo));
    EXPECT_FALSE(isExported(global, internal));
    EXPECT_FALSE(isExported(global, hidden));
    EXPECT_FALSE(isExported(local, 0));
    EXPECT_FALSE(isExported(weak, 0));
}

TEST_F(ElfTables, NameNoSymbolThatLeadsOutOfTheFile) {
    put<std::uint32_t>(value(symbolsTag) + 24, 0xFFFFFF); // The name of symbol 1.
    EXPECT_THAT(exportedNames(file()), testing::IsEmpty());
    put<std::uint32_t>(value(gnuHashTag) + 4, 2);
    put<std::uint16_t>(value(symbolsTag) + 30, 0);
    EXPECT_THAT(wantedSymbols(file()), testing::IsEmpty());
    restart();
    setValue(symbolsTag, elfPlaces.fileEnd - 24); // Only symbol 0 is in the file.
    EXPECT_THAT(exportedNames(file()), testing::IsEmpty());
    put<std::uint32_t>(value(gnuHashTag) + 4, 2);
    EXPECT_THAT(wantedSymbols(file()), testing::IsEmpty());
}

TEST_F(ElfTables, MayExportNothing) {
    put<std::uint32_t>(value(gnuHashTag) + 24, 0); // The only bucket is empty.
    EXPECT_THAT(exportedNames(file()), testing::IsEmpty());
    EXPECT_FALSE(hasEntryPoint());
    EXPECT_EQ(read().damage, L"");
}

TEST_F(ElfTables, HaveChainsThatAreFollowedOnlySoFar) {
    // A chain of the two kinds of names without an end, up to the end of the file.
    const std::size_t chain = value(gnuHashTag) + 28;
    for (const std::size_t length : {std::size_t{4000}, std::size_t{5000}}) {
        restart();
        bytes.resize(chain + length * 4, '\0');
        std::fill(bytes.begin() + static_cast<std::ptrdiff_t>(chain), bytes.end(), '\x02');
        put<std::uint64_t>(0x40 + 32, bytes.size()); // The segment of the whole file.
        put<std::uint64_t>(0x40 + 40, bytes.size());
        EXPECT_FALSE(hasEntryPoint()) << length;
    }
}

TEST_F(ElfTables, AreReadWhateverTheirFilterIs) {
    for (const std::uint32_t shift : {0U, 30U, 31U, 32U, 63U, 64U, 0xFFFFFFFFU}) {
        put(value(gnuHashTag) + 12, shift);
        EXPECT_TRUE(hasEntryPoint()) << shift;
    }
}

} // namespace
