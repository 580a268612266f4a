// SPDX-License-Identifier: BSL-1.0
/// Reads ELF files as the loader does: from the segments and the dynamic section, not from the
/// sections, which may be stripped. The entry point is looked up through the hash tables, so the
/// time does not depend on the number of symbols.
#include "components/componentTools/images/libraryImage.h"
#include "components/platform/elfMachine.h"

#include <algorithm>
#include <string_view>

namespace Mz::Tools {

namespace {

struct Identity {
    unsigned char magic[4], wordSize, byteOrder, version, abi, rest[8];
};

struct Header {
    Identity identity;
    std::uint16_t type, machine;
    std::uint32_t version;
    std::uint64_t entry, segments, sections;
    std::uint32_t flags;
    std::uint16_t headerSize, segmentSize, segmentCount, sectionSize, sectionCount, names;
};

struct Segment {
    std::uint32_t type, flags;
    std::uint64_t offset, address, physical, fileSize, memorySize, alignment;
};

struct Section {
    std::uint32_t name, type;
    std::uint64_t flags, address, offset, size;
    std::uint32_t link, info;
    std::uint64_t alignment, entrySize;
};

struct Dynamic {
    std::int64_t tag;
    std::uint64_t value;
};

struct Symbol {
    std::uint32_t name;
    unsigned char info, other;
    std::uint16_t section;
    std::uint64_t value, size;
};

constexpr std::uint16_t executable = 2, shared = 3;
constexpr std::uint32_t programContent = 1; // the type of a section
constexpr std::uint32_t loadSegment = 1, dynamicSegment = 2;

/// Limits far above those of real libraries. They bound the time and memory for a malicious file.
constexpr std::size_t maximumSegments = 1024;
constexpr std::size_t maximumDynamicEntries = 4096;
constexpr std::size_t maximumNeeded = 1024;
constexpr std::size_t maximumChainLength = 4096;
constexpr std::uint64_t maximumSymbols = 1u << 18;
constexpr std::size_t maximumNameBytes = std::size_t{16} << 20;
constexpr unsigned int globalBinding = 1;

std::wstring processorName(std::uint16_t machine, bool narrow) {
    switch (machine) {
    case 3: return L"x86, 32 bits";
    case 40: return L"ARM, 32 bits";
    case platform::elfAArch64: return L"ARM, 64 bits";
    case 243: return L"RISC-V";
    case platform::elfX86_64: return narrow ? L"x86-64 with 32-bit addresses" : L"x86-64";
    default: return L"number " + std::to_wstring(machine);
    }
}

class ElfReader {
  public:
    ElfReader(FileBytes& bytes, LibraryImage& result) : file(bytes), image(result) {}

    void read() {
        image.format = ImageFormat::elf;
        if (!readHeader() || !image.otherProcessor.empty() ||
            image.kind == LibraryImage::Kind::other)
            return;
        if (!readSegments() || !readDynamic())
            return;
        if (program || image.kind == LibraryImage::Kind::program)
            image.kind = LibraryImage::Kind::program;
        else
            findEntryPoint();
    }

    /// Returns the undefined global symbols without a version. A symbol with a version can only
    /// come from a dependency.
    std::vector<std::string> wantedSymbols() {
        std::vector<std::string> names;
        std::size_t bytes = 0;
        const std::uint64_t count = std::min<std::uint64_t>(unhashedSymbols(), maximumSymbols);
        for (std::uint64_t index = 1; index < count && bytes < maximumNameBytes; ++index) {
            const auto symbol = readAt<Symbol>(symbols + index * sizeof(Symbol));
            if (!symbol || symbol->section != 0 || symbol->info >> 4 != globalBinding ||
                isVersioned(index))
                continue;
            if (auto text = name(symbol->name)) {
                bytes += text->size();
                names.push_back(std::move(*text));
            }
        }
        return names;
    }

    /// Returns the names of the symbols that are exported and not weak.
    std::vector<std::string> exportedNames() {
        std::vector<std::string> names;
        const std::uint64_t count = std::min<std::uint64_t>(symbolCount(), maximumSymbols);
        for (std::uint64_t index = 1; index < count; ++index) {
            const auto symbol = readAt<Symbol>(symbols + index * sizeof(Symbol));
            const unsigned int visibility = symbol ? symbol->other & 3 : 0;
            if (!symbol || symbol->section == 0 || symbol->info >> 4 != globalBinding ||
                visibility == 1 || visibility == 2)
                continue;
            if (auto text = name(symbol->name))
                names.push_back(std::move(*text));
        }
        return names;
    }

    /// Returns the content of the sections. Unlike everything else, they are found by the table of
    /// sections, which the loader does not need.
    std::string sections(std::string_view prefix) {
        std::string content;
        std::vector<Section> wanted;
        if (!readHeader() || !image.otherProcessor.empty() || header.sectionSize != sizeof(Section))
            return content;
        section(0); // So that the block with the first one has as many of the others as it can.
        const auto names = section(header.names);
        if (names)
            file.read<char>(names->offset); // The same for the names.
        for (std::size_t index = 0; names && index < header.sectionCount; ++index) {
            const auto candidate = section(index);
            if (!candidate || candidate->type != programContent || candidate->name >= names->size)
                continue;
            char name[32] = {};
            const std::uint64_t length =
                std::min<std::uint64_t>(prefix.size(), names->size - candidate->name);
            if (length == prefix.size() && length <= sizeof name &&
                file.read(names->offset + candidate->name, name, prefix.size()) &&
                std::string_view(name, prefix.size()) == prefix)
                wanted.push_back(*candidate);
        }
        // Afterwards: their bytes would take the place of the tables in the cached blocks.
        for (const Section& found : wanted)
            appendSection(file, found.offset, found.size, content);
        return content;
    }

    bool defines(std::string_view wanted) {
        return symbols && strings && (gnuHash || hash) && find(wanted);
    }

  private:
    bool damaged(const wchar_t* what) {
        image.damage = what;
        return false;
    }

    bool readHeader() {
        const auto identity = file.read<Identity>(0);
        const auto type = file.read<std::uint16_t>(16);
        const auto machine = file.read<std::uint16_t>(18);
        if (!identity || !type || !machine)
            return damaged(L"the header is cut off");
        const bool sameOrder = identity->byteOrder == platform::nativeElfOrder;
        const auto ordered = [&](std::uint16_t value) {
            return sameOrder ? value : static_cast<std::uint16_t>(value << 8 | value >> 8);
        };
        if (ordered(*type) == shared)
            image.kind = LibraryImage::Kind::library;
        else if (ordered(*type) == executable)
            image.kind = LibraryImage::Kind::program;
        if (ordered(*machine) != platform::nativeElfMachine || identity->wordSize != 2 ||
            !sameOrder) {
            image.otherProcessor = processorName(ordered(*machine), identity->wordSize != 2);
            return true;
        }
        const auto whole = file.read<Header>(0);
        if (!whole)
            return damaged(L"the header is cut off");
        header = *whole;
        return true;
    }

    std::optional<Section> section(std::size_t index) {
        if (index >= header.sectionCount)
            return std::nullopt;
        return file.read<Section>(header.sections + index * sizeof(Section));
    }

    bool readSegments() {
        if (header.segmentSize != sizeof(Segment) || header.segmentCount > maximumSegments)
            return damaged(L"the table of segments makes no sense");
        // Section headers are usually at the end, so a truncated file lacks them.
        if (!file.reaches(header.sections, header.sectionCount * std::uint64_t{header.sectionSize}))
            return damaged(L"the end is missing");
        for (std::size_t index = 0; index < header.segmentCount; ++index) {
            const auto segment = file.read<Segment>(header.segments + index * sizeof(Segment));
            if (!segment)
                return damaged(L"the table of segments is cut off");
            if (segment->type == loadSegment) {
                if (!file.reaches(segment->offset, segment->fileSize))
                    return damaged(L"a part that is to be loaded is missing");
                loaded.push_back(*segment);
            } else if (segment->type == dynamicSegment) {
                dynamic = *segment;
            }
        }
        if (!dynamic && image.kind == LibraryImage::Kind::library)
            return damaged(L"it has no table of symbols");
        return dynamic.has_value();
    }

    bool readDynamic() {
        std::vector<std::uint64_t> neededNames, rpaths, runpaths;
        const std::size_t count =
            std::min<std::uint64_t>(dynamic->fileSize / sizeof(Dynamic), maximumDynamicEntries);
        for (std::size_t index = 0; index < count; ++index) {
            const auto entry = file.read<Dynamic>(dynamic->offset + index * sizeof(Dynamic));
            if (!entry)
                return damaged(L"its dynamic section is cut off");
            if (entry->tag == 0)
                break;
            note(*entry, neededNames, rpaths, runpaths);
        }
        if (strings && !namesEnd())
            return damaged(L"its table of names has no end");
        neededNames.resize(std::min(neededNames.size(), maximumNeeded));
        if (ownName)
            image.ownName = name(ownName).value_or("");
        return readNames(neededNames, image.needed) && readFolders(rpaths, image.rpath) &&
               readFolders(runpaths, image.runpath);
    }

    void note(const Dynamic& entry, std::vector<std::uint64_t>& neededNames,
              std::vector<std::uint64_t>& rpaths, std::vector<std::uint64_t>& runpaths) {
        switch (entry.tag) {
        case 1: neededNames.push_back(entry.value); break;
        case 4: hash = entry.value; break;
        case 5: strings = entry.value; break;
        case 6: symbols = entry.value; break;
        case 10: stringsSize = entry.value; break;
        case 14: ownName = entry.value; break;
        case 15: rpaths.push_back(entry.value); break;
        case 29: runpaths.push_back(entry.value); break;
        case 0x6FFFFEF5: gnuHash = entry.value; break;
        case 0x6FFFFFF0: versions = entry.value; break;
        case 0x6FFFFFFB: program = (entry.value & 0x08000000) != 0; break;
        default: break;
        }
    }

    /// Returns whether the string table ends with NUL. The loader does not check the ends of names.
    bool namesEnd() {
        if (ownName >= stringsSize)
            return false;
        const auto offset = offsetOf(strings, stringsSize);
        return offset && file.read<char>(*offset + stringsSize - 1) == '\0';
    }

    std::optional<std::string> name(std::uint64_t position) {
        if (position >= stringsSize)
            return std::nullopt;
        const auto offset = offsetOf(strings + position, 1);
        return offset ? file.text(*offset) : std::nullopt;
    }

    bool readNames(const std::vector<std::uint64_t>& positions, std::vector<std::string>& names) {
        for (const std::uint64_t position : positions) {
            const auto text = name(position);
            if (!text)
                return damaged(L"the name of a library that it needs is missing");
            names.push_back(*text);
        }
        return true;
    }

    bool readFolders(const std::vector<std::uint64_t>& positions,
                     std::vector<std::string>& folders) {
        std::vector<std::string> lists;
        if (!readNames(positions, lists))
            return false;
        for (const std::string& list : lists)
            for (std::string_view rest = list; !rest.empty();) {
                const std::string_view folder = rest.substr(0, rest.find(':'));
                if (!folder.empty())
                    folders.emplace_back(folder);
                rest.remove_prefix(std::min(folder.size() + 1, rest.size()));
            }
        return true;
    }

    std::optional<std::uint64_t> offsetOf(std::uint64_t address, std::size_t size) const {
        for (const Segment& segment : loaded) {
            if (address < segment.address)
                continue;
            const std::uint64_t inside = address - segment.address;
            if (inside <= segment.fileSize && size <= segment.fileSize - inside)
                return segment.offset + inside;
        }
        return std::nullopt;
    }

    template <class T>
    std::optional<T> readAt(std::uint64_t address) {
        const auto offset = offsetOf(address, sizeof(T));
        return offset ? file.read<T>(*offset) : std::nullopt;
    }

    void findEntryPoint() {
        if (!symbols || !strings || (!gnuHash && !hash)) {
            damaged(L"it has no table of symbols");
            return;
        }
        const auto symbol = find(entryPointName);
        if (!symbol)
            return;
        // Functions in assembly often have no type; type 10 is resolved at load time (IFUNC).
        const unsigned int type = symbol->info & 15;
        const bool function = type == 0 || type == 2 || type == 10;
        image.entryPoint =
            function ? LibraryImage::EntryPoint::function : LibraryImage::EntryPoint::noFunction;
        if (const auto stamp = find(stampName); stamp && isData(*stamp))
            image.stamp = validStamp(readAt<ComponentStamp>(stamp->value));
    }

    /// Returns whether the symbol's value is the address of an object, or of something without
    /// type.
    static bool isData(const Symbol& symbol) {
        constexpr std::uint16_t firstSpecialSection = 0xFF00;
        const unsigned int type = symbol.info & 15;
        return (type == 0 || type == 1) && symbol.section < firstSpecialSection;
    }

    /// Returns the exported symbol with that name.
    std::optional<Symbol> find(std::string_view wanted) {
        return gnuHash ? findByGnuHash(wanted) : findByHash(wanted);
    }

    /// Returns the number of symbols that may be undefined. The GNU hash table begins after them.
    std::uint64_t unhashedSymbols() {
        if (!symbols || !strings)
            return 0;
        if (gnuHash)
            return readAt<std::uint32_t>(gnuHash + 4).value_or(0);
        return hash ? readAt<std::uint32_t>(hash + 4).value_or(0) : 0;
    }

    /// Returns the number of symbols. The GNU hash table does not contain it, so this function
    /// looks for the end of its last chain.
    std::uint64_t symbolCount() {
        if (!symbols || !strings || !gnuHash)
            return unhashedSymbols();
        const auto bucketCount = readAt<std::uint32_t>(gnuHash);
        const auto first = readAt<std::uint32_t>(gnuHash + 4);
        const auto bloomCount = readAt<std::uint32_t>(gnuHash + 8);
        if (!bucketCount || !first || !bloomCount)
            return 0;
        const std::uint64_t buckets = gnuHash + 16 + *bloomCount * 8ull;
        const std::uint64_t chains = buckets + *bucketCount * 4ull;
        std::uint64_t last = 0;
        for (std::uint64_t index = 0; index < std::min<std::uint64_t>(*bucketCount, maximumSymbols);
             ++index)
            last = std::max<std::uint64_t>(last,
                                           readAt<std::uint32_t>(buckets + index * 4).value_or(0));
        while (last >= *first && last < maximumSymbols) {
            const auto entry = readAt<std::uint32_t>(chains + (last - *first) * 4);
            ++last;
            if (!entry || *entry & 1)
                break;
        }
        return std::max<std::uint64_t>(last, *first);
    }

    bool isVersioned(std::uint64_t index) {
        constexpr std::uint16_t hidden = 0x8000, firstVersion = 2;
        const auto version = versions ? readAt<std::uint16_t>(versions + index * 2) : std::nullopt;
        return version && (*version & ~hidden) >= firstVersion;
    }

    std::optional<Symbol> findByGnuHash(std::string_view wanted) {
        struct Table {
            std::uint32_t bucketCount, firstSymbol, bloomCount, bloomShift;
        };
        const auto table = readAt<Table>(gnuHash);
        if (!table || !table->bucketCount)
            return std::nullopt;
        std::uint32_t code = 5381;
        for (const char c : wanted)
            code = code * 33 + static_cast<unsigned char>(c);
        const std::uint64_t buckets = gnuHash + sizeof(Table) + table->bloomCount * 8ull;
        const std::uint64_t chains = buckets + table->bucketCount * 4ull;
        const auto bucket = readAt<std::uint32_t>(buckets + code % table->bucketCount * 4ull);
        if (!bucket || *bucket < table->firstSymbol)
            return std::nullopt;
        for (std::size_t step = 0; step < maximumChainLength; ++step) {
            const std::uint64_t index = *bucket + step;
            const auto entry = readAt<std::uint32_t>(chains + (index - table->firstSymbol) * 4);
            if (!entry)
                return std::nullopt;
            if ((*entry | 1) == (code | 1))
                if (auto symbol = definition(index, wanted))
                    return symbol;
            if (*entry & 1)
                return std::nullopt;
        }
        return std::nullopt;
    }

    std::optional<Symbol> findByHash(std::string_view wanted) {
        struct Table {
            std::uint32_t bucketCount, chainCount;
        };
        const auto table = readAt<Table>(hash);
        if (!table || !table->bucketCount)
            return std::nullopt;
        std::uint32_t code = 0;
        for (const char c : wanted) {
            code = (code << 4) + static_cast<unsigned char>(c);
            code = (code ^ (code >> 28 << 28) >> 24) & 0x0FFFFFFF;
        }
        const std::uint64_t buckets = hash + sizeof(Table);
        const std::uint64_t chains = buckets + table->bucketCount * 4ull;
        auto index = readAt<std::uint32_t>(buckets + code % table->bucketCount * 4ull);
        for (std::size_t step = 0; index && *index && step < maximumChainLength; ++step) {
            if (auto symbol = definition(*index, wanted))
                return symbol;
            index = readAt<std::uint32_t>(chains + *index * 4ull);
        }
        return std::nullopt;
    }

    /// Returns the symbol if it has that name and is exported.
    std::optional<Symbol> definition(std::uint64_t index, std::string_view wanted) {
        const auto symbol = readAt<Symbol>(symbols + index * sizeof(Symbol));
        if (!symbol || symbol->section == 0 || name(symbol->name) != wanted)
            return std::nullopt;
        const unsigned int binding = symbol->info >> 4, visibility = symbol->other & 3;
        if (binding == 0 || visibility == 1 || visibility == 2)
            return std::nullopt;
        return symbol;
    }

    FileBytes& file;
    LibraryImage& image;
    Header header{};
    std::vector<Segment> loaded;
    std::optional<Segment> dynamic;
    bool program = false;
    std::uint64_t symbols = 0, strings = 0, stringsSize = 0, hash = 0, gnuHash = 0;
    std::uint64_t ownName = 0, versions = 0;
};

} // namespace

void readElfImage(FileBytes& file, LibraryImage& image) {
    ElfReader(file, image).read();
}

namespace {

bool isElf(FileBytes& file) {
    const auto magic = file.read<std::array<char, 4>>(0);
    return magic && std::string_view(magic->data(), magic->size()) == "\177ELF";
}

} // namespace

std::string elfSections(FileBytes& file, std::string_view prefix) {
    LibraryImage image;
    return ElfReader(file, image).sections(prefix);
}

std::vector<std::string> exportedElfNames(FileBytes& file) {
    LibraryImage image;
    ElfReader reader(file, image);
    reader.read();
    return reader.exportedNames();
}

std::vector<std::string> wantedSymbols(const std::filesystem::path& path) {
    FileBytes file(path);
    if (!isElf(file))
        return {};
    LibraryImage image;
    ElfReader reader(file, image);
    reader.read();
    return reader.wantedSymbols();
}

bool removeDefined(const std::filesystem::path& path, std::set<std::string>& names) {
    FileBytes file(path);
    if (!isElf(file))
        return false;
    LibraryImage image;
    ElfReader reader(file, image);
    reader.read();
    if (!image.damage.empty())
        return false;
    std::erase_if(names, [&](const std::string& name) { return reader.defines(name); });
    return true;
}

} // namespace Mz::Tools
