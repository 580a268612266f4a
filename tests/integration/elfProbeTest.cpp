// SPDX-License-Identifier: BSL-1.0
/// Tests the reader of ELF symbol tables with valid, damaged and random files.
#include "components/platform/posix/elfProbe.h"
#include "tests/integration/managerFixture.h"

#include <algorithm>
#include <cstring>
#include <elf.h>
#include <fstream>
#include <iterator>
#include <random>
#include <sys/mman.h>
#include <unistd.h>

using Mz::platform::elfExportsFunction;
using Mz::platform::ExportState;
using Mz::Test::buildFolder;
using Mz::Test::builtComponent;

namespace {

constexpr const char* entryPoint = "QrGetComponentDescription";

/// A file in memory, readable through a descriptor.
class MemoryFile {
  public:
    explicit MemoryFile(const std::string& content) : descriptor(::memfd_create("elf", 0)) {
        rewrite(content);
    }
    ~MemoryFile() { ::close(descriptor); }
    MemoryFile(const MemoryFile&) = delete;
    MemoryFile& operator=(const MemoryFile&) = delete;

    void rewrite(const std::string& content) {
        resize(content.size());
        EXPECT_EQ(::pwrite(descriptor, content.data(), content.size(), 0),
                  static_cast<ssize_t>(content.size()));
    }
    void resize(std::size_t size) {
        EXPECT_EQ(::ftruncate(descriptor, static_cast<off_t>(size)), 0);
    }
    bool exports(const char* symbol = entryPoint) const {
        return elfExportsFunction(descriptor, symbol) == ExportState::exported;
    }

  private:
    int descriptor;
};

bool exports(const std::string& content, const char* symbol = entryPoint) {
    return MemoryFile(content).exports(symbol);
}

std::string contentOf(const std::filesystem::path& file) {
    std::ifstream stream(file, std::ios::binary);
    EXPECT_TRUE(stream.good()) << file;
    return std::string(std::istreambuf_iterator<char>(stream), {});
}

template <class T>
T get(const std::string& content, std::size_t offset) {
    T value;
    std::memcpy(&value, content.data() + offset, sizeof value);
    return value;
}

template <class T>
void put(std::string& content, std::size_t offset, const T& value) {
    std::memcpy(content.data() + offset, &value, sizeof value);
}

/// Each test runs with both kinds of hash table: GNU and System V.
class ElfProbe : public ::testing::TestWithParam<const wchar_t*> {
  protected:
    ElfProbe() : whole(contentOf(builtComponent(GetParam()))) {}

    bool usesGnuHash() const { return std::wstring(GetParam()) == L"tiny-gnu"; }

    Elf64_Ehdr header() const { return get<Elf64_Ehdr>(whole, 0); }

    /// Returns the content with `change` applied to its ELF header.
    template <class Change>
    std::string withHeader(Change change) const {
        std::string content = whole;
        Elf64_Ehdr changed = header();
        change(changed);
        put(content, 0, changed);
        return content;
    }

    /// Returns the offset of the first program header of that type.
    std::size_t segment(std::uint32_t type) const {
        for (std::size_t index = 0; index < header().e_phnum; ++index) {
            const std::size_t offset = header().e_phoff + index * sizeof(Elf64_Phdr);
            if (get<Elf64_Phdr>(whole, offset).p_type == type)
                return offset;
        }
        ADD_FAILURE() << "no segment of type " << type;
        return 0;
    }

    /// Returns the offset of the dynamic entry with that tag.
    std::size_t dynamicEntry(std::int64_t tag) const {
        const auto dynamic = get<Elf64_Phdr>(whole, segment(PT_DYNAMIC));
        for (std::size_t offset = dynamic.p_offset;; offset += sizeof(Elf64_Dyn)) {
            const auto entry = get<Elf64_Dyn>(whole, offset);
            if (entry.d_tag == tag)
                return offset;
            if (entry.d_tag == DT_NULL)
                break;
        }
        ADD_FAILURE() << "no dynamic entry " << tag;
        return 0;
    }

    /// Returns the file offset of the hash table. The library maps its first segment at address 0,
    /// so offsets equal addresses.
    std::size_t hashTable() const {
        return get<Elf64_Dyn>(whole, dynamicEntry(usesGnuHash() ? DT_GNU_HASH : DT_HASH))
            .d_un.d_ptr;
    }

    std::string withDynamic(std::int64_t tag, std::uint64_t value) const {
        std::string content = whole;
        const std::size_t offset = dynamicEntry(tag);
        auto entry = get<Elf64_Dyn>(content, offset);
        entry.d_un.d_val = value;
        put(content, offset, entry);
        return content;
    }

    std::string whole;
};

INSTANTIATE_TEST_SUITE_P(Tiny, ElfProbe, ::testing::Values(L"tiny-gnu", L"tiny-sysv"),
                         [](const auto& parameter) {
                             return std::string(parameter.index ? "SysvHash" : "GnuHash");
                         });

TEST_P(ElfProbe, FindsFunctionsThatAreDefinedAndNothingElse) {
    EXPECT_TRUE(exports(whole));
    EXPECT_TRUE(exports(whole, "anotherFunction"));
    EXPECT_FALSE(exports(whole, "someData"));
    EXPECT_FALSE(exports(whole, "noSuchFunction"));
    EXPECT_FALSE(exports(whole, ""));
    EXPECT_FALSE(exports(whole, std::string(5000, 'x').c_str()));
}

TEST_P(ElfProbe, FindsNothingInALibraryCutAtAnyLength) {
    MemoryFile file(whole);
    std::vector<std::size_t> found;
    for (std::size_t length = whole.size(); length-- > 0;) {
        file.resize(length);
        if (file.exports())
            found.push_back(length);
    }
    EXPECT_TRUE(found.empty()) << "accepted as a library at " << found.size() << " lengths from "
                               << found.back() << " to " << found.front() << " of " << whole.size();
}

TEST_P(ElfProbe, FindsNothingInALibraryWithoutAllThatTheLoaderWouldMap) {
    std::size_t mapped = 0;
    for (std::size_t index = 0; index < header().e_phnum; ++index) {
        const auto one = get<Elf64_Phdr>(whole, header().e_phoff + index * sizeof(Elf64_Phdr));
        if (one.p_type == PT_LOAD)
            mapped = std::max<std::size_t>(mapped, one.p_offset + one.p_filesz);
    }
    ASSERT_GT(mapped, 0u);
    EXPECT_FALSE(exports(whole.substr(0, mapped - 1)));
    EXPECT_FALSE(exports(whole.substr(0, mapped / 2)));
}

TEST_P(ElfProbe, SurvivesRandomDamage) {
    std::mt19937 random(7);
    MemoryFile file(whole);
    int stillFound = 0;
    constexpr int rounds = 20000;
    for (int round = 0; round < rounds; ++round) {
        std::string content = whole;
        for (auto count = 1 + random() % 8; count > 0; --count) {
            // Half of the damage hits the tables at the beginning.
            const std::size_t range = random() % 2 ? content.size() : 1024;
            content[random() % range] = static_cast<char>(random());
        }
        file.rewrite(content);
        stillFound += file.exports();
    }
    EXPECT_GT(stillFound, 0);
    EXPECT_LT(stillFound, rounds);
}

TEST_P(ElfProbe, SurvivesExtremeValuesInEveryWord) {
    MemoryFile file(whole);
    const std::size_t end = std::min<std::size_t>(whole.size(), 0x1000);
    for (std::size_t offset = 0; offset + 8 <= end; offset += 4)
        for (const std::uint64_t value :
             {std::uint64_t{0}, ~std::uint64_t{0}, std::uint64_t{1} << 63,
              ~std::uint64_t{0} - 0xFFF, std::uint64_t{0x7FFFFFFFFFFFFFFF}}) {
            std::string content = whole;
            put(content, offset, value);
            file.rewrite(content);
            static_cast<void>(file.exports());
        }
    const auto dynamic = get<Elf64_Phdr>(whole, segment(PT_DYNAMIC));
    for (std::size_t offset = dynamic.p_offset; offset < dynamic.p_offset + dynamic.p_filesz;
         offset += 8)
        for (const std::uint64_t value :
             {std::uint64_t{0}, ~std::uint64_t{0}, ~std::uint64_t{0} - 7, std::uint64_t{1} << 63}) {
            std::string content = whole;
            put(content, offset, value);
            file.rewrite(content);
            static_cast<void>(file.exports());
        }
}

TEST_P(ElfProbe, RefusesHeadersOfOtherKindsOfFile) {
    const auto refuses = [this](auto change) { return !exports(withHeader(change)); };
    EXPECT_TRUE(exports(withHeader([](Elf64_Ehdr&) {})));
    EXPECT_TRUE(refuses([](Elf64_Ehdr& h) { h.e_ident[EI_MAG3] = 'G'; }));
    EXPECT_TRUE(refuses([](Elf64_Ehdr& h) { h.e_ident[EI_CLASS] = ELFCLASS32; }));
    EXPECT_TRUE(refuses([](Elf64_Ehdr& h) { h.e_ident[EI_DATA] = 3 - h.e_ident[EI_DATA]; }));
    EXPECT_TRUE(refuses(
        [](Elf64_Ehdr& h) { h.e_machine = h.e_machine == EM_X86_64 ? EM_AARCH64 : EM_X86_64; }));
    EXPECT_TRUE(refuses([](Elf64_Ehdr& h) { h.e_machine = EM_386; }));
    EXPECT_TRUE(refuses([](Elf64_Ehdr& h) { h.e_type = ET_EXEC; }));
    EXPECT_TRUE(refuses([](Elf64_Ehdr& h) { h.e_type = ET_REL; }));
    EXPECT_TRUE(refuses([](Elf64_Ehdr& h) { h.e_type = ET_CORE; }));
    EXPECT_TRUE(refuses([](Elf64_Ehdr& h) { h.e_phentsize = sizeof(Elf32_Phdr); }));
    EXPECT_TRUE(refuses([](Elf64_Ehdr& h) { h.e_phnum = 0; }));
    EXPECT_TRUE(refuses([](Elf64_Ehdr& h) { h.e_phnum = 0xFFFF; }));
    // The last header is cut off, or in a small file all of them.
    EXPECT_TRUE(refuses([this](Elf64_Ehdr& h) {
        h.e_phnum = 1024;
        h.e_phoff = whole.size() - 1023 * sizeof(Elf64_Phdr);
    }));
    EXPECT_TRUE(refuses([](Elf64_Ehdr& h) { h.e_phoff = ~std::uint64_t{0}; }));
    EXPECT_TRUE(refuses([](Elf64_Ehdr& h) { h.e_phoff = ~std::uint64_t{0} - 55; }));
    EXPECT_TRUE(refuses([](Elf64_Ehdr& h) { h.e_phoff = std::uint64_t{1} << 63; }));
    EXPECT_TRUE(refuses([this](Elf64_Ehdr& h) { h.e_phoff = whole.size() - 56; }));
}

TEST_P(ElfProbe, RefusesDynamicEntriesThatLeadNowhere) {
    const std::int64_t hash = usesGnuHash() ? DT_GNU_HASH : DT_HASH;
    for (const std::int64_t tag :
         {static_cast<std::int64_t>(DT_SYMTAB), static_cast<std::int64_t>(DT_STRTAB), hash})
        for (const std::uint64_t value :
             {std::uint64_t{0}, ~std::uint64_t{0}, ~std::uint64_t{0} - 23, std::uint64_t{1} << 63,
              std::uint64_t{0x7FFFFFFFFFFFFFF0}, static_cast<std::uint64_t>(whole.size())})
            EXPECT_FALSE(exports(withDynamic(tag, value))) << tag << " " << value;
    EXPECT_FALSE(exports(withDynamic(DT_STRSZ, 0)));
    EXPECT_FALSE(exports(withDynamic(DT_STRSZ, 8)));
}

TEST_P(ElfProbe, RefusesNamesThatLeadOutOfTheTableOfStrings) {
    const auto stringsSize = get<Elf64_Dyn>(whole, dynamicEntry(DT_STRSZ)).d_un.d_val;
    for (const std::int64_t tag : {DT_NEEDED, DT_SONAME, DT_RPATH, DT_RUNPATH}) {
        const auto withName = [&](std::uint64_t position) {
            std::string content = whole;
            // The loader ignores the entry for the size of symbols, so the test puts its entry
            // there.
            Elf64_Dyn entry{};
            entry.d_tag = tag;
            entry.d_un.d_val = position;
            put(content, dynamicEntry(DT_SYMENT), entry);
            return content;
        };
        EXPECT_TRUE(exports(withName(stringsSize - 1))) << tag;
        EXPECT_FALSE(exports(withName(stringsSize))) << tag;
        EXPECT_FALSE(exports(withName(~std::uint64_t{0}))) << tag;
    }
}

TEST_P(ElfProbe, RefusesATableOfStringsThatHasNoEnd) {
    const auto strings = get<Elf64_Dyn>(whole, dynamicEntry(DT_STRTAB)).d_un.d_ptr;
    const auto size = get<Elf64_Dyn>(whole, dynamicEntry(DT_STRSZ)).d_un.d_val;
    std::string content = whole;
    EXPECT_EQ(content[strings + size - 1], '\0');
    content[strings + size - 1] = 'x';
    EXPECT_FALSE(exports(content));
    EXPECT_FALSE(exports(withDynamic(DT_STRSZ, whole.size())));
    EXPECT_FALSE(exports(withDynamic(DT_STRSZ, ~std::uint64_t{0}))); // Its end overflows.
}

TEST_P(ElfProbe, RefusesSegmentsWithOffsetsNearTheEndOfAllNumbers) {
    std::string content = whole;
    const std::size_t dynamic = segment(PT_DYNAMIC);
    auto changed = get<Elf64_Phdr>(whole, dynamic);
    for (const std::uint64_t offset : {~std::uint64_t{0}, ~std::uint64_t{0} - 15,
                                       std::uint64_t{1} << 63, std::uint64_t{0x7FFFFFFFFFFFFFFF}}) {
        changed.p_offset = offset;
        put(content, dynamic, changed);
        EXPECT_FALSE(exports(content));
    }
    changed = get<Elf64_Phdr>(whole, dynamic);
    changed.p_filesz = ~std::uint64_t{0}; // Must not crash. An entry marks the end, not the size.
    put(content, dynamic, changed);
    static_cast<void>(exports(content));
    content = whole;
    const std::size_t load = segment(PT_LOAD);
    auto mapped = get<Elf64_Phdr>(whole, load);
    mapped.p_offset = ~std::uint64_t{0} - 0xFFF;
    put(content, load, mapped);
    EXPECT_FALSE(exports(content));
}

TEST_P(ElfProbe, RefusesATableWithoutBuckets) {
    std::string content = whole;
    put(content, hashTable(), std::uint32_t{0});
    EXPECT_FALSE(exports(content));
    put(content, hashTable(), ~std::uint32_t{0});
    EXPECT_FALSE(exports(content));
    if (usesGnuHash()) {
        content = whole;
        put(content, hashTable() + 8, std::uint32_t{0}); // No words in the filter.
        EXPECT_FALSE(exports(content));
    }
}

TEST_P(ElfProbe, ShiftsTheHashOfTheFilterAsTheProcessorDoes) {
    if (!usesGnuHash())
        GTEST_SKIP() << "this kind of table has no filter";
    std::uint32_t hash = 5381;
    for (const char* c = entryPoint; *c; ++c)
        hash = hash * 33 + static_cast<unsigned char>(*c);
    const std::size_t table = hashTable();
    const auto words = get<std::uint32_t>(whole, table + 8);
    const auto passes = [&](std::uint32_t shift, std::uint64_t filter) {
        std::string content = whole;
        put(content, table + 12, shift);
        for (std::size_t word = 0; word < words; ++word)
            put(content, table + 16 + word * 8, filter);
        return exports(content);
    };
    for (const std::uint32_t shift : {0U, 6U, 30U, 31U, 32U, 33U, 63U, 64U, 0xFFFFFFFFU}) {
        const std::uint64_t first = std::uint64_t{1} << hash % 64;
        const std::uint64_t second = std::uint64_t{1} << (hash >> shift % 32) % 64;
        EXPECT_TRUE(passes(shift, first | second)) << shift;
        EXPECT_FALSE(passes(shift, ~first)) << shift;
        EXPECT_FALSE(passes(shift, ~second)) << shift;
    }
}

TEST_P(ElfProbe, EndsOnAChainThatNeverEnds) {
    std::string content = whole;
    const std::size_t table = hashTable();
    const auto buckets = get<std::uint32_t>(content, table);
    if (usesGnuHash()) {
        // The filter passes every name, and no entry ends its chain.
        const auto filter = get<std::uint32_t>(content, table + 8);
        for (std::size_t word = 0; word < filter; ++word)
            put(content, table + 16 + word * 8, ~std::uint64_t{0});
        const std::size_t chains = table + 16 + filter * 8 + buckets * 4;
        for (std::size_t entry = 0; entry < 3; ++entry)
            put(content, chains + entry * 4,
                get<std::uint32_t>(content, chains + entry * 4) & ~std::uint32_t{1});
    } else {
        // Every entry points to itself.
        const auto entries = get<std::uint32_t>(content, table + 4);
        for (std::uint32_t entry = 0; entry < entries; ++entry)
            put(content, table + 8 + buckets * 4 + entry * 4, entry);
    }
    EXPECT_FALSE(exports(content, "noSuchFunction"));
    EXPECT_FALSE(exports(content, "noOtherFunctionEither"));
}

TEST_P(ElfProbe, EndsOnAChainThatIsLongerThanThoseOfLibraries) {
    if (!usesGnuHash())
        GTEST_SKIP() << "a chain of this kind of table has no more entries than symbols";
    // A table after the end of the library: one bucket, a filter that passes every name, and a
    // chain of entries that neither match nor end it.
    std::string content = whole + std::string(-whole.size() % 16, '\0');
    const std::uint64_t table = content.size();
    content += std::string(64 * 1024, '\0');
    for (std::size_t field = 0; field < 4; ++field)
        put(content, table + field * 4, std::uint32_t{1});
    put(content, table + 16, ~std::uint64_t{0});
    put(content, table + 24, std::uint32_t{1});
    const std::size_t load = segment(PT_LOAD), dynamic = dynamicEntry(DT_GNU_HASH);
    auto mapped = get<Elf64_Phdr>(content, load);
    mapped.p_filesz = content.size();
    put(content, load, mapped);
    auto entry = get<Elf64_Dyn>(content, dynamic);
    entry.d_un.d_ptr = table;
    put(content, dynamic, entry);
    EXPECT_FALSE(exports(content));
    // The same with the entry of the function, whose symbol follows from its place in the chain.
    std::uint32_t hash = 5381;
    for (const char* c = entryPoint; *c; ++c)
        hash = hash * 33 + static_cast<unsigned char>(*c);
    for (std::size_t symbol = 0; symbol < 8; ++symbol)
        put(content, table + 28 + symbol * 4, hash & ~std::uint32_t{1});
    EXPECT_TRUE(exports(content));
}

TEST_P(ElfProbe, RefusesSymbolsThatAreNotForOthersToSee) {
    // Changes all symbols. Their names follow them.
    const std::size_t symbols = get<Elf64_Dyn>(whole, dynamicEntry(DT_SYMTAB)).d_un.d_ptr;
    const std::size_t names = get<Elf64_Dyn>(whole, dynamicEntry(DT_STRTAB)).d_un.d_ptr;
    ASSERT_GT(names, symbols);
    const std::size_t count = (names - symbols) / sizeof(Elf64_Sym);
    const auto changed = [&](auto change) {
        std::string content = whole;
        for (std::size_t index = 1; index < count; ++index) {
            const std::size_t offset = symbols + index * sizeof(Elf64_Sym);
            auto symbol = get<Elf64_Sym>(content, offset);
            change(symbol);
            put(content, offset, symbol);
        }
        return exports(content);
    };
    EXPECT_TRUE(changed([](Elf64_Sym&) {}));
    EXPECT_TRUE(changed([](Elf64_Sym& s) { s.st_info = ELF64_ST_INFO(STB_WEAK, STT_FUNC); }));
    EXPECT_TRUE(changed([](Elf64_Sym& s) { s.st_info = ELF64_ST_INFO(STB_GLOBAL, STT_NOTYPE); }));
    EXPECT_TRUE(
        changed([](Elf64_Sym& s) { s.st_info = ELF64_ST_INFO(STB_GLOBAL, STT_GNU_IFUNC); }));
    EXPECT_FALSE(changed([](Elf64_Sym& s) { s.st_info = ELF64_ST_INFO(STB_LOCAL, STT_FUNC); }));
    EXPECT_FALSE(changed([](Elf64_Sym& s) { s.st_info = ELF64_ST_INFO(STB_GLOBAL, STT_OBJECT); }));
    EXPECT_FALSE(changed([](Elf64_Sym& s) { s.st_info = ELF64_ST_INFO(STB_GLOBAL, STT_TLS); }));
    EXPECT_FALSE(changed([](Elf64_Sym& s) { s.st_shndx = SHN_UNDEF; }));
    EXPECT_FALSE(changed([](Elf64_Sym& s) { s.st_other = STV_HIDDEN; }));
    EXPECT_FALSE(changed([](Elf64_Sym& s) { s.st_other = STV_INTERNAL; }));
    EXPECT_TRUE(changed([](Elf64_Sym& s) { s.st_other = STV_PROTECTED; }));
    EXPECT_FALSE(changed([](Elf64_Sym& s) { s.st_name = ~std::uint32_t{0}; }));
}

TEST(ElfProbeOnFiles, AgreesWithTheLoaderOnEveryTestComponent) {
    int with = 0;
    for (const auto& entry :
         std::filesystem::recursive_directory_iterator(buildFolder / "components")) {
        if (!entry.is_regular_file() || entry.path().extension() != ".so")
            continue;
        const std::string name = entry.path().stem().string();
        const bool expected = name != "noEntryPoint" && name != "dataEntryPoint" &&
                              name != "entryPointInDependency" && name != "throwsEverything" &&
                              !name.starts_with("neededLeaf") && !name.starts_with("neededMiddle");
        EXPECT_EQ(exports(contentOf(entry.path())), expected) << entry.path();
        with += expected;
    }
    EXPECT_GT(with, 20);
}

TEST(ElfProbeOnFiles, RefusesAProgramThatExportsTheFunction) {
    EXPECT_FALSE(
        exports(contentOf(buildFolder / "components" / "exportingProgram" / "exportingProgram")));
}

TEST(ElfProbeOnFiles, RefusesShortTextsAndZeros) {
    for (const std::size_t length :
         {0u, 1u, 4u, 16u, 63u, 64u, 65u, 8191u, 8192u, 8193u, 100000u}) {
        EXPECT_FALSE(exports(std::string(length, '\0')));
        EXPECT_FALSE(exports(std::string("\177ELF\2\1\1") + std::string(length, '\0')));
        EXPECT_FALSE(exports(std::string("\177ELF\2\1\1") + std::string(length, '\377')));
    }
    EXPECT_EQ(elfExportsFunction(-1, entryPoint), ExportState::unknown);
}

} // namespace
