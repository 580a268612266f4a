// SPDX-License-Identifier: BSL-1.0
/// Looks up an export in a DLL file as the loader would.
///
/// The check reads the headers, the sections and the export directory, and does a binary search in
/// the sorted table of names. The search takes the same steps as the loader's. So each entry that
/// the loader examines for this name was checked here, and an unsorted table has the same result in
/// both. The three export tables must be in the file completely. Therefore a wrong count costs at
/// most one step for each bit of the file's size.
///
/// Only the sections map addresses to file offsets. They must have the layout that linkers produce:
/// aligned, in ascending order and complete in the file. Then each address has one offset, and the
/// loader sees the bytes that were checked here.
#include "components/platform/windows/peProbe.h"

#include <algorithm>
#include <array>
#include <compare>
#include <cstring>
#include <string_view>
#include <vector>

namespace Mz::platform {

namespace {

struct FileHeader {
    std::uint32_t signature;
    std::uint16_t machine, sectionCount;
    std::uint32_t time, symbolTable, symbolCount;
    std::uint16_t optionalSize, characteristics;
};

/// The fixed part of the optional header, with 64-bit addresses.
struct OptionalHeader {
    std::uint16_t magic;
    std::uint16_t linkerVersion;
    std::uint32_t codeSize, dataSize, zeroedSize, entryPoint, codeBase;
    std::uint64_t imageBase;
    std::uint32_t sectionAlignment, fileAlignment;
    std::uint16_t versions[6];
    std::uint32_t reserved, imageSize, headersSize, checksum;
    std::uint16_t subsystem, flags;
    std::uint64_t stackAndHeap[4];
    std::uint32_t loaderFlags, directoryCount;
};
static_assert(sizeof(OptionalHeader) == 112);

struct Directory {
    std::uint32_t address, size;
};

struct Section {
    char name[8];
    std::uint32_t memorySize, address, fileSize, offset;
    std::uint32_t relocations, lines;
    std::uint16_t relocationCount, lineCount;
    std::uint32_t flags;
};

struct Exports {
    std::uint32_t flags, time, version, name, base, functionCount, nameCount, functions, names,
        ordinals;
};

struct Import {
    std::uint32_t lookup, time, forwarder, name, addresses;
};

constexpr std::uint16_t dosSignature = 0x5A4D; // "MZ"
constexpr std::uint32_t peSignature = 0x4550;  // "PE"
constexpr std::uint16_t x86_64 = 0x8664;
constexpr std::uint16_t wideOptionalHeader = 0x20B;
constexpr std::uint16_t libraryFlag = 0x2000;
constexpr std::uint32_t executableFlag = 0x20000000;
constexpr std::uint32_t pageSize = 0x1000;
constexpr std::uint32_t sectorSize = 0x200;
constexpr std::size_t exportDirectory = 0, importDirectory = 1, certificateDirectory = 4;
constexpr std::uint64_t symbolSize = 18;

/// Limits that bound the work for a hostile file. Real libraries are far below them. Older versions
/// of the system had the first one, too.
constexpr std::size_t maximumSections = 96;
constexpr std::size_t maximumImports = 1024;

class PeLibrary {
  public:
    explicit PeLibrary(ByteSource& source) : file(source) {}

    bool exports(std::string_view symbol) {
        return readHeaders() && readSections() && isComplete() && readExports() &&
               isCodeOfLibrary(ordinalOf(symbol)) && importsAreTerminated();
    }

  private:
    bool readHeaders() {
        if (file.read<std::uint16_t>(0) != dosSignature)
            return false;
        const auto start = file.read<std::uint32_t>(0x3C);
        const auto whole = start ? file.read<FileHeader>(*start) : std::nullopt;
        if (!whole || whole->signature != peSignature || whole->machine != x86_64 ||
            !(whole->characteristics & libraryFlag))
            return false;
        header = *whole;
        optionalOffset = std::uint64_t{*start} + sizeof(FileHeader);
        const auto common = file.read<OptionalHeader>(optionalOffset);
        if (!common || header.optionalSize < sizeof(OptionalHeader) ||
            common->magic != wideOptionalHeader)
            return false;
        optional = *common;
        return optional.sectionAlignment >= pageSize;
    }

    bool readSections() {
        if (header.sectionCount > maximumSections)
            return false;
        const std::uint64_t table = optionalOffset + header.optionalSize;
        std::uint64_t end = 0; // The end of the previous section.
        for (std::size_t index = 0; index < header.sectionCount; ++index) {
            const auto section = file.read<Section>(table + index * sizeof(Section));
            if (!section || section->address < end || section->address % pageSize ||
                !isInFile(*section))
                return false;
            end = section->address + std::uint64_t{memorySize(*section)};
            sections.push_back(*section);
        }
        return end <= optional.imageSize;
    }

    /// Returns whether the file contains the section completely, at an aligned offset. The system
    /// rounds offsets down to a sector, and also maps parts that the file lacks.
    bool isInFile(const Section& section) const {
        return section.fileSize == 0 ||
               (section.offset % sectorSize == 0 && file.reaches(section.offset, section.fileSize));
    }

    /// Returns whether the file also contains the data that linkers and signing tools append after
    /// the sections. The system does not need it, but a file without it is truncated.
    bool isComplete() {
        if (header.symbolTable && header.symbolCount) {
            const std::uint64_t strings = header.symbolTable + header.symbolCount * symbolSize;
            const auto stringsSize = file.read<std::uint32_t>(strings);
            if (!stringsSize || !file.reaches(strings, *stringsSize))
                return false;
        }
        const Directory certificates = directory(certificateDirectory); // Its address is an offset.
        return file.reaches(certificates.address, certificates.size);
    }

    bool readExports() {
        exportRange = directory(exportDirectory);
        if (exportRange.size < sizeof(Exports) || !offsetOf(exportRange.address, exportRange.size))
            return false;
        table = readAt<Exports>(exportRange.address).value_or(Exports{});
        return hasTable(table.functions, table.functionCount, sizeof(std::uint32_t)) &&
               hasTable(table.names, table.nameCount, sizeof(std::uint32_t)) &&
               hasTable(table.ordinals, table.nameCount, sizeof(std::uint16_t));
    }

    /// Returns whether the file contains a table of `count` elements of `width` bytes.
    bool hasTable(std::uint32_t address, std::uint32_t count, std::uint64_t width) const {
        return offsetOf(address, count * width).has_value();
    }

    /// Returns the index of `symbol` in the table of functions; `std::nullopt` if it is not
    /// exported.
    std::optional<std::uint16_t> ordinalOf(std::string_view symbol) {
        std::int64_t low = 0;
        std::int64_t high = std::int64_t{table.nameCount} - 1;
        while (low <= high) {
            const std::int64_t middle = (low + high) / 2;
            const auto position = static_cast<std::uint64_t>(middle);
            const auto name = readAt<std::uint32_t>(table.names + position * 4);
            const auto order = name ? compare(*name, symbol) : std::nullopt;
            if (!order)
                return std::nullopt;
            if (std::is_eq(*order))
                return readAt<std::uint16_t>(table.ordinals + position * 2);
            if (std::is_gt(*order))
                high = middle - 1;
            else
                low = middle + 1;
        }
        return std::nullopt;
    }

    /// Compares the name at `address` with `symbol` as `strcmp` does. Returns `std::nullopt` if the
    /// section ends before the result is known.
    std::optional<std::strong_ordering> compare(std::uint32_t address, std::string_view symbol) {
        std::array<char, 64> text;
        const Section* section = sectionOf(address);
        if (!section || address - section->address >= backedSize(*section))
            return std::nullopt;
        const std::uint32_t inside = address - section->address;
        const std::size_t length =
            std::min<std::size_t>({backedSize(*section) - inside, symbol.size() + 1, text.size()});
        if (!file.read(std::uint64_t{section->offset} + inside, text.data(), length))
            return std::nullopt;
        for (std::size_t index = 0; index < length; ++index) {
            const auto one = static_cast<unsigned char>(text[index]);
            const auto other =
                static_cast<unsigned char>(index < symbol.size() ? symbol[index] : '\0');
            if (one != other || !one)
                return one <=> other;
        }
        return std::nullopt;
    }

    /// Returns whether the function is in an executable section of this library. An address inside
    /// the export directory is not: it is the name to which the export is forwarded.
    bool isCodeOfLibrary(std::optional<std::uint16_t> ordinal) {
        if (!ordinal || *ordinal >= table.functionCount)
            return false;
        const auto function = readAt<std::uint32_t>(table.functions + *ordinal * 4ull);
        if (!function || (*function >= exportRange.address &&
                          *function - exportRange.address < exportRange.size))
            return false;
        const Section* section = sectionOf(*function);
        return section && (section->flags & executableFlag);
    }

    /// Returns whether the list of imported libraries and their names are terminated inside the
    /// file. The loader does not check that.
    bool importsAreTerminated() {
        const Directory imports = directory(importDirectory);
        if (!imports.address)
            return true;
        for (std::size_t index = 0; index < maximumImports; ++index) {
            const auto import = readAt<Import>(imports.address + index * sizeof(Import));
            if (!import || !import->name)
                return import.has_value();
            if (!isTerminated(import->name))
                return false;
        }
        return false;
    }

    /// Returns whether the text at `address` ends inside its section.
    bool isTerminated(std::uint32_t address) {
        std::array<char, 256> text;
        const Section* section = sectionOf(address);
        if (!section || address - section->address >= backedSize(*section))
            return false;
        const std::uint32_t inside = address - section->address;
        const std::size_t length =
            std::min<std::size_t>(backedSize(*section) - inside, text.size());
        return file.read(std::uint64_t{section->offset} + inside, text.data(), length) &&
               std::memchr(text.data(), '\0', length);
    }

    /// Returns an entry of the table of directories; an empty one if the table is shorter.
    Directory directory(std::size_t index) {
        const std::uint64_t offset = sizeof(OptionalHeader) + index * sizeof(Directory);
        if (index >= optional.directoryCount || offset + sizeof(Directory) > header.optionalSize)
            return {0, 0};
        return file.read<Directory>(optionalOffset + offset).value_or(Directory{0, 0});
    }

    /// Returns the size of the section in memory.
    static std::uint32_t memorySize(const Section& section) {
        return section.memorySize ? section.memorySize : section.fileSize;
    }

    /// Returns how many bytes of the section come from the file. The rest is zero.
    static std::uint32_t backedSize(const Section& section) {
        return std::min(section.fileSize, memorySize(section));
    }

    /// Returns the section that contains `address`, or null.
    const Section* sectionOf(std::uint64_t address) const {
        for (const Section& section : sections)
            if (address >= section.address && address - section.address < memorySize(section))
                return &section;
        return nullptr;
    }

    /// Returns the offset in the file of the `size` bytes at `address`; `std::nullopt` unless one
    /// section contains all of them in the file.
    std::optional<std::uint64_t> offsetOf(std::uint64_t address, std::uint64_t size) const {
        const Section* section = sectionOf(address);
        if (!section)
            return std::nullopt;
        const std::uint64_t inside = address - section->address;
        const std::uint64_t backed = backedSize(*section);
        if (inside > backed || size > backed - inside)
            return std::nullopt;
        return section->offset + inside;
    }

    /// Returns the `T` at `address`; `std::nullopt` if it is not in the file.
    template <class T>
    std::optional<T> readAt(std::uint64_t address) {
        const std::optional<std::uint64_t> offset = offsetOf(address, sizeof(T));
        return offset ? file.read<T>(*offset) : std::nullopt;
    }

    FileBlocks file;
    FileHeader header{};
    std::uint64_t optionalOffset = 0;
    OptionalHeader optional{};
    std::vector<Section> sections;
    Directory exportRange{}; ///< the address range of the export directory
    Exports table{};
};

} // namespace

bool peExportsFunction(ByteSource& source, const char* symbol) {
    return PeLibrary(source).exports(symbol);
}

} // namespace Mz::platform
