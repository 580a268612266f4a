// SPDX-License-Identifier: BSL-1.0
/// Tests the reader of Windows libraries with valid, damaged and random files. The reader is
/// portable, so the test runs on every system.
#include "components/platform/windows/peProbe.h"
#include "tests/support/peFile.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <random>

using namespace Mz::Test;

namespace {

constexpr const char* entryPoint = "QrGetComponentDescription";

/// A file in memory that counts the reads.
class MemorySource final : public Mz::platform::ByteSource {
  public:
    explicit MemorySource(const std::string& content) : content(content) {}

    std::uint64_t size() const override { return content.size(); }
    std::size_t read(std::uint64_t offset, void* data, std::size_t length) override {
        ++reads;
        if (offset >= content.size())
            return 0;
        return content.copy(static_cast<char*>(data), length, static_cast<std::size_t>(offset));
    }

    int reads = 0;

  private:
    const std::string& content;
};

bool exports(const std::string& content, const char* symbol = entryPoint) {
    MemorySource source(content);
    return Mz::platform::peExportsFunction(source, symbol);
}

class PeProbe : public ::testing::Test {
  protected:
    /// Returns the content with a 32-bit field of the export directory changed.
    std::string withExports(std::size_t field, std::uint32_t value) const {
        return changedAt(whole, exportsOf(whole) + field, value);
    }
    template <class T>
    std::string withHeader(std::size_t field, T value) const {
        return changedAt(whole, headerOf(whole) + field, value);
    }
    std::string withSection(std::size_t index, std::size_t field, std::uint32_t value) const {
        return changedAt(whole, sectionsOf(whole) + index * PeField::sectionEntry + field, value);
    }

    const std::string whole = madeLibrary({{entryPoint, peCode},
                                           {"anotherFunction", peCode + 1},
                                           {"forwarded", peExports + 60},
                                           {"nowhere", 0x9000},
                                           {"someData", peData},
                                           {"zero", 0}});
};

TEST_F(PeProbe, FindsFunctionsThatAreDefinedAndNothingElse) {
    EXPECT_TRUE(exports(whole));
    EXPECT_TRUE(exports(whole, "anotherFunction"));
    EXPECT_FALSE(exports(whole, "forwarded"));
    EXPECT_FALSE(exports(whole, "nowhere"));
    EXPECT_FALSE(exports(whole, "someData"));
    EXPECT_FALSE(exports(whole, "zero"));
    EXPECT_FALSE(exports(whole, "noSuchFunction"));
    EXPECT_FALSE(exports(whole, "QrGetComponentDescriptio"));
    EXPECT_FALSE(exports(whole, "QrGetComponentDescription2"));
    EXPECT_FALSE(exports(whole, ""));
    EXPECT_FALSE(exports(whole, std::string(5000, 'x').c_str()));
}

TEST_F(PeProbe, FindsNothingInALibraryCutAtAnyLength) {
    for (std::size_t length = 0; length < whole.size(); ++length)
        ASSERT_FALSE(exports(whole.substr(0, length))) << length << " of " << whole.size();
}

TEST_F(PeProbe, FindsNothingInALibraryWhoseSymbolsOrCertificateAreCutAtAnyLength) {
    const auto end = static_cast<std::uint32_t>(whole.size());
    std::string symbols = withHeader(PeField::symbolTable, end);
    putAt(symbols, headerOf(symbols) + PeField::symbolCount, std::uint32_t{2});
    symbols += std::string(2 * 18, 's') + std::string("\x08\0\0\0abc\0", 8);
    std::string certificate = withHeader(PeField::certificateOffset, end);
    putAt(certificate, headerOf(certificate) + PeField::certificateSize, std::uint32_t{24});
    certificate += std::string(24, 'c');
    for (const std::string& content : {symbols, certificate}) {
        EXPECT_TRUE(exports(content));
        EXPECT_TRUE(exports(content + "more"));
        for (std::size_t length = end; length < content.size(); ++length)
            ASSERT_FALSE(exports(content.substr(0, length))) << length << " of " << content.size();
    }
}

TEST_F(PeProbe, RefusesHeadersOfOtherKindsOfFile) {
    EXPECT_TRUE(exports(withHeader(PeField::machine, std::uint16_t{0x8664})));
    EXPECT_FALSE(exports(withHeader(PeField::machine, std::uint16_t{0x14C})));
    EXPECT_FALSE(exports(withHeader(PeField::machine, std::uint16_t{0xAA64})));
    EXPECT_FALSE(exports(withHeader(PeField::magic, std::uint16_t{0x10B})));
    EXPECT_FALSE(exports(withHeader(PeField::characteristics, std::uint16_t{0x22}))); // a program
    EXPECT_FALSE(exports(withHeader(0, std::uint32_t{0x4551})));
    EXPECT_FALSE(exports(changedAt(whole, 0, 'N')));
    for (const std::uint32_t start :
         {0u, static_cast<std::uint32_t>(whole.size()), 0x7FFFFFFFu, 0x80000000u, 0xFFFFFFFFu})
        EXPECT_FALSE(exports(changedAt(whole, 0x3C, start))) << start;
    EXPECT_FALSE(exports(withHeader(PeField::optionalSize, std::uint16_t{0})));
    EXPECT_FALSE(exports(withHeader(PeField::optionalSize, std::uint16_t{0xFFFF})));
    EXPECT_FALSE(exports(withHeader(PeField::directoryCount, std::uint32_t{0})));
    EXPECT_FALSE(exports(withHeader(PeField::sectionAlignment, std::uint32_t{0x200})));
    EXPECT_FALSE(exports(withHeader(PeField::imageSize, std::uint32_t{0x2000})));
    EXPECT_FALSE(exports(withHeader(PeField::sectionCount, std::uint16_t{0})));
    EXPECT_FALSE(exports(withHeader(PeField::sectionCount, std::uint16_t{2})));
    EXPECT_FALSE(exports(withHeader(PeField::sectionCount, std::uint16_t{0xFFFF})));
}

TEST_F(PeProbe, RefusesSectionsThatTheLoaderWouldMapOtherwise) {
    for (std::size_t section = 0; section < 3; ++section) {
        EXPECT_FALSE(exports(withSection(section, PeField::offset, 0x7FFFFE00))) << section;
        EXPECT_FALSE(exports(withSection(section, PeField::offset, 0x410))) << section;
        EXPECT_FALSE(exports(withSection(section, PeField::fileSize, 0xFFFFFFFF))) << section;
        EXPECT_FALSE(exports(withSection(section, PeField::address, 0x1010))) << section;
        EXPECT_FALSE(exports(withSection(section, PeField::address, 0xFFFFF000))) << section;
        EXPECT_FALSE(exports(withSection(section, PeField::memorySize, 0xFFFFFFFF))) << section;
    }
    EXPECT_FALSE(exports(withSection(1, PeField::address, peCode)));    // Two at one address.
    EXPECT_FALSE(exports(withSection(0, PeField::flags, 0x40000020u))); // Code that cannot run.
    // Sections whose size in memory is smaller or larger than their size in the file.
    EXPECT_TRUE(exports(withSection(0, PeField::memorySize, 1)));
    EXPECT_FALSE(exports(withSection(2, PeField::memorySize, 40)));
    EXPECT_FALSE(exports(withSection(2, PeField::fileSize, 0)));
    EXPECT_TRUE(exports(withSection(2, PeField::memorySize, 0))); // Old linkers write 0.
}

TEST_F(PeProbe, RefusesExportDirectoriesThatLeadNowhere) {
    const auto end = static_cast<std::uint32_t>(peExports + 0x200);
    for (const std::uint32_t address : {0u, 1u, 0x400u, peExports + 1, end - 39, end, 0xFF0000u,
                                        0x7FFFFFFFu, 0xFFFFFFFFu, 0xFFFFFFD8u})
        EXPECT_FALSE(exports(withHeader(PeField::exportAddress, address))) << address;
    for (const std::uint32_t size : {0u, 39u, 0x201u, 0x7FFFFFFFu, 0xFFFFFFFFu})
        EXPECT_FALSE(exports(withHeader(PeField::exportSize, size))) << size;
    EXPECT_FALSE(exports(withExports(PeField::nameCount, 0x1000000)));
    EXPECT_FALSE(exports(withExports(PeField::functions, 0xFF0000)));
    EXPECT_FALSE(exports(withExports(PeField::names, 0xFF0000)));
    EXPECT_FALSE(exports(withExports(PeField::ordinals, 0xFF0000)));
    for (const std::size_t table : {PeField::functions, PeField::names, PeField::ordinals})
        for (const std::uint32_t address :
             {0u, 1u, end - 4, end, 0x80000000u, 0xFFFFFFFFu, 0xFFFFFFFCu})
            EXPECT_FALSE(exports(withExports(table, address))) << table << " " << address;
    for (const std::size_t count : {PeField::functionCount, PeField::nameCount})
        for (const std::uint32_t value : {0u, 0x80u, 0x40000000u, 0x80000000u, 0xFFFFFFFFu})
            EXPECT_FALSE(exports(withExports(count, value))) << count << " " << value;
}

TEST_F(PeProbe, RefusesNamesAndOrdinalsThatLeadNowhere) {
    const std::size_t names =
        placeOf(whole, getAt<std::uint32_t>(whole, exportsOf(whole) + PeField::names));
    const std::size_t ordinals =
        placeOf(whole, getAt<std::uint32_t>(whole, exportsOf(whole) + PeField::ordinals));
    // `names` is the entry that the binary search compares last.
    for (const std::uint32_t address : {0u, 0x9000u, peExports + 0x1FFu, 0xFFFFFFFFu})
        EXPECT_FALSE(exports(changedAt(whole, names, address))) << address;
    EXPECT_TRUE(exports(changedAt(whole, ordinals, std::uint16_t{1})));
    EXPECT_FALSE(exports(changedAt(whole, ordinals, std::uint16_t{2}))); // forwarded
    EXPECT_FALSE(exports(changedAt(whole, ordinals, std::uint16_t{4}))); // data
    EXPECT_FALSE(exports(changedAt(whole, ordinals, std::uint16_t{6})));
    EXPECT_FALSE(exports(changedAt(whole, ordinals, std::uint16_t{0xFFFF})));
}

TEST_F(PeProbe, RefusesImportsThatLeadNowhere) {
    // An import list with one library and its end mark, in the free space of the export section.
    constexpr std::uint32_t list = peExports + 0x180, name = peExports + 0x1F8;
    std::string content = withSection(2, PeField::memorySize, 0x200);
    const auto changed = [&](std::uint32_t listAddress, std::uint32_t nameAddress) {
        std::string result = content;
        putAt(result, headerOf(result) + PeField::importAddress, listAddress);
        putAt(result, placeOf(result, list) + 12, nameAddress);
        return exports(result);
    };
    content.replace(placeOf(content, name), 8, "needed\0x", 8);
    EXPECT_TRUE(changed(list, name));
    for (const std::uint32_t address : {1u, 0x9000u, peExports + 0x1F0, 0xFFFFFFFFu})
        EXPECT_FALSE(changed(address, name)) << address;
    for (const std::uint32_t address : {1u, 0x9000u, peExports + 0x1FF, 0xFFFFFFFFu})
        EXPECT_FALSE(changed(list, address)) << address;
    putAt(content, placeOf(content, list) + 20 + 12, name); // No end mark.
    content.replace(placeOf(content, list) + 40, 0x1F8 - 0x180 - 40, 0x1F8 - 0x180 - 40, 'x');
    EXPECT_FALSE(changed(list, name));
}

TEST_F(PeProbe, RefusesMoreImportsThanLibrariesHave) {
    // The import list replaces a long name of an export.
    constexpr std::uint32_t most = 1023, entrySize = 20;
    std::string content =
        madeLibrary({{entryPoint, peCode}, {std::string((most + 2) * entrySize, 'z'), peCode}});
    const auto addressOf = [&](std::size_t offset) {
        return peExports + static_cast<std::uint32_t>(offset - placeOf(content, peExports));
    };
    const std::size_t list = content.find("zz");
    const std::uint32_t name = addressOf(content.find("made.dll"));
    content.replace(list, (most + 2) * entrySize, (most + 2) * entrySize, '\0');
    putAt(content, headerOf(content) + PeField::importAddress, addressOf(list));
    for (std::uint32_t index = 0; index < most; ++index)
        putAt(content, list + index * entrySize + 12, name);
    EXPECT_TRUE(exports(content));
    putAt(content, list + most * entrySize + 12, name);
    EXPECT_FALSE(exports(content));
}

TEST_F(PeProbe, ComparesNamesToTheEndOfTheirSection) {
    // The name ends at the end of the section, with and without its terminator.
    std::string content = madeLibrary({{entryPoint, peCode}});
    const std::size_t name = content.find(entryPoint);
    const auto length = static_cast<std::uint32_t>(std::strlen(entryPoint));
    const std::size_t names = exportsOf(content) + 44;
    const auto atEnd = [&](std::uint32_t size) {
        std::string changed = content;
        changed.replace(name, length, length, 'x');
        changed.replace(changed.size() - size, size, std::string(entryPoint, size));
        putAt(changed, names, peExports + 0x200 - size);
        // Makes the size in memory equal to the size in the file.
        putAt(changed, sectionsOf(changed) + 2 * PeField::sectionEntry + PeField::memorySize,
              std::uint32_t{0x200});
        return changed;
    };
    EXPECT_TRUE(exports(atEnd(length + 1)));
    EXPECT_FALSE(exports(atEnd(length)));
    EXPECT_FALSE(exports(atEnd(1)));
}

TEST_F(PeProbe, SearchesAsTheLoaderDoes) {
    std::vector<PeExport> many;
    for (int index = 0; index < 2000; ++index)
        many.push_back({"f" + std::to_string(10000 + index), peCode});
    for (const std::size_t position : {std::size_t{0}, std::size_t{1}, many.size()}) {
        std::vector<PeExport> sorted = many;
        sorted.push_back({position == 0 ? "a" : position == 1 ? "f10000a" : "\xFF", peCode});
        std::ranges::sort(sorted, {}, &PeExport::name);
        const std::string library = madeLibrary(sorted);
        for (const PeExport& one : sorted)
            ASSERT_TRUE(exports(library, one.name.c_str())) << one.name;
        EXPECT_FALSE(exports(library, "f"));
        EXPECT_FALSE(exports(library, "f12000"));
    }
    // A binary search misses names that are not sorted, in the system as here.
    EXPECT_FALSE(exports(madeLibrary({{"b", peCode}, {"c", peCode}, {"a", peCode}}), "a"));
}

TEST_F(PeProbe, AsksForFewPiecesHoweverManyNamesThereAre) {
    // 16 million names, all present and all the same.
    constexpr std::uint32_t count = 0x1000000;
    std::string content = whole;
    const std::uint32_t table = peExports + 0x1000;
    const std::uint32_t size = 0x1000 + count * 4;
    content.resize(content.size() - 0x200 + size);
    for (const std::size_t field : {PeField::memorySize, PeField::fileSize})
        putAt(content, sectionsOf(content) + 2 * PeField::sectionEntry + field, size);
    putAt(content, headerOf(content) + PeField::imageSize, peExports + size);
    putAt(content, exportsOf(content) + PeField::nameCount, count);
    putAt(content, exportsOf(content) + PeField::names, table);
    putAt(content, exportsOf(content) + PeField::ordinals, table);
    const std::size_t first = placeOf(content, table);
    for (std::uint32_t index = 0; index < count; ++index)
        putAt(content, first + index * 4, table - 4); // an empty name
    MemorySource source(content);
    EXPECT_FALSE(Mz::platform::peExportsFunction(source, entryPoint));
    EXPECT_LT(source.reads, 100);
    EXPECT_GT(source.reads, 10); // The search did run.
}

TEST_F(PeProbe, SurvivesRandomDamage) {
    std::mt19937 random(7);
    int stillFound = 0;
    constexpr int rounds = 20000;
    for (int round = 0; round < rounds; ++round) {
        std::string content = whole;
        for (auto count = 1 + random() % 8; count > 0; --count) {
            // Half of the damage hits the headers.
            const std::size_t range = random() % 2 ? content.size() : 0x200;
            content[random() % range] = static_cast<char>(random());
        }
        stillFound += exports(content);
    }
    EXPECT_GT(stillFound, 0);
    EXPECT_LT(stillFound, rounds);
}

TEST_F(PeProbe, SurvivesExtremeValuesInEveryWord) {
    for (std::size_t offset = 0; offset + 4 <= whole.size(); offset += 2)
        for (const std::uint32_t value :
             {0u, 0xFFFFFFFFu, 0x7FFFFFFFu, 0x80000000u, 0xFFFFFFFCu, 0x1000000u, 0xFF0000u})
            static_cast<void>(exports(changedAt(whole, offset, value)));
}

TEST_F(PeProbe, RefusesShortTextsAndZeros) {
    for (const std::size_t length : {0u, 1u, 2u, 63u, 64u, 65u, 4096u, 100000u}) {
        EXPECT_FALSE(exports(std::string(length, '\0')));
        EXPECT_FALSE(exports("MZ" + std::string(length, '\0')));
        EXPECT_FALSE(exports("MZ" + std::string(length, '\377')));
    }
}

} // namespace
