// SPDX-License-Identifier: BSL-1.0
/// Reads PE files as the loader does: from the sections and the data directories. The entry point
/// is found by binary search, because the export table is sorted.
#include "components/componentTools/images/libraryImage.h"

#include <algorithm>
#include <cstring>
#include <string_view>

namespace Mz::Tools {

namespace {

struct FileHeader {
    std::uint32_t signature;
    std::uint16_t machine, sectionCount;
    std::uint32_t time, symbols, symbolCount;
    std::uint16_t optionalSize, characteristics;
};

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

struct ResourceTable {
    std::uint32_t flags, time, version;
    std::uint16_t namedCount, numberedCount;
};

struct ResourceEntry {
    std::uint32_t id, offset;
};

constexpr std::uint16_t x86_64 = 0x8664;
constexpr std::uint16_t wideOptionalHeader = 0x20B;
constexpr std::uint16_t libraryFlag = 0x2000, programFlag = 0x0002;
constexpr std::uint32_t executableFlag = 0x20000000;
constexpr std::size_t exportDirectory = 0, importDirectory = 1, resourceDirectory = 2,
                      certificateDirectory = 4;
constexpr std::uint32_t pageSize = 0x1000, sectorSize = 0x200;

/// Limits far above those of real libraries. They bound the time and memory for a malicious file.
constexpr std::size_t maximumSections = 96;
constexpr std::size_t maximumNeeded = 1024;
constexpr std::size_t maximumResources = 4096;
constexpr std::uint32_t maximumNames = 65536;

std::wstring processorName(std::uint16_t machine) {
    switch (machine) {
    case 0x14C: return L"x86, 32 bits";
    case 0x1C4: return L"ARM, 32 bits";
    case 0xAA64: return L"ARM, 64 bits";
    default: return L"number " + std::to_wstring(machine);
    }
}

class PeReader {
  public:
    PeReader(FileBytes& bytes, LibraryImage& result) : file(bytes), image(result) {}

    void read() {
        if (!readHeader() || !image.otherProcessor.empty() || !readSections())
            return;
        if (!readImports())
            return;
        if (image.kind == LibraryImage::Kind::library) {
            findEntryPoint();
            image.hasManifest = findManifest();
        }
    }

    /// Returns the names of the export table.
    std::vector<std::string> exportedNames() {
        std::vector<std::string> names;
        const Directory exportTable = directory(exportDirectory);
        const auto exports =
            exportTable.address ? readAt<Exports>(exportTable.address) : std::nullopt;
        const std::uint32_t count = exports ? std::min(exports->nameCount, maximumNames) : 0;
        for (std::uint32_t index = 0; index < count; ++index) {
            const auto address = readAt<std::uint32_t>(exports->names + index * 4ull);
            if (auto name = address ? textAt(*address) : std::nullopt)
                names.push_back(std::move(*name));
        }
        return names;
    }

    /// Returns the content of the sections.
    std::string sectionContents(std::string_view prefix) {
        std::string content;
        if (!readHeader() || !image.otherProcessor.empty() || !readSections())
            return content;
        for (const Section& section : sections)
            if (std::string_view(section.name, sizeof section.name).starts_with(prefix))
                appendSection(file, section.offset, backedSize(section), content);
        return content;
    }

  private:
    bool damaged(const wchar_t* what) {
        image.damage = what;
        return false;
    }

    bool readHeader() {
        const auto start = file.read<std::uint32_t>(0x3C);
        const auto signature = start ? file.read<std::uint32_t>(*start) : std::nullopt;
        if (!signature || *signature != 0x4550)
            return false; // A DOS program, or a text that begins with MZ.
        image.format = ImageFormat::pe;
        const auto whole = file.read<FileHeader>(*start);
        if (!whole)
            return damaged(L"the header is cut off");
        header = *whole;
        optional = *start + sizeof(FileHeader);
        if (header.characteristics & libraryFlag)
            image.kind = LibraryImage::Kind::library;
        else if (header.characteristics & programFlag)
            image.kind = LibraryImage::Kind::program;
        const auto magic = file.read<std::uint16_t>(optional);
        if (header.machine != x86_64) {
            image.otherProcessor = processorName(header.machine);
            return true;
        }
        const auto alignment = file.read<std::uint32_t>(optional + 32);
        if (!magic || *magic != wideOptionalHeader || !alignment || *alignment < pageSize)
            return damaged(L"the header makes no sense");
        return true;
    }

    bool readSections() {
        if (header.sectionCount > maximumSections)
            return damaged(L"the table of sections makes no sense");
        const std::uint64_t table = optional + header.optionalSize;
        const std::uint32_t imageSize = file.read<std::uint32_t>(optional + 56).value_or(0);
        std::uint64_t end = 0; // of the sections so far
        for (std::size_t index = 0; index < header.sectionCount; ++index) {
            const auto section = file.read<Section>(table + index * sizeof(Section));
            if (!section)
                return damaged(L"the table of sections is cut off");
            if (section->fileSize && !file.reaches(section->offset, section->fileSize))
                return damaged(L"the end is missing");
            if (section->address < end || section->address % pageSize ||
                (section->fileSize && section->offset % sectorSize))
                return damaged(L"the table of sections makes no sense");
            end = std::uint64_t{section->address} + memorySize(*section);
            sections.push_back(*section);
        }
        if (end > imageSize)
            return damaged(L"the table of sections makes no sense");
        return hasAppendix();
    }

    /// Checks the linker's symbols and the certificate, which follow the sections. The system does
    /// not need them, but if they are announced and absent, the file is truncated.
    bool hasAppendix() {
        const std::uint64_t strings = header.symbols + header.symbolCount * 18ull;
        const bool hasSymbols = header.symbols && header.symbolCount;
        const auto stringsSize = hasSymbols ? file.read<std::uint32_t>(strings) : 0;
        const Directory certificate = directory(certificateDirectory); // by offset, not address
        if (!stringsSize || (hasSymbols && !file.reaches(strings, *stringsSize)) ||
            !file.reaches(certificate.address, certificate.size))
            return damaged(L"the end is missing");
        return true;
    }

    Directory directory(std::size_t index) {
        const auto count = file.read<std::uint32_t>(optional + 108);
        const std::uint64_t offset = 112 + index * sizeof(Directory);
        if (!count || index >= *count || offset + sizeof(Directory) > header.optionalSize)
            return {0, 0};
        return file.read<Directory>(optional + offset).value_or(Directory{0, 0});
    }

    static std::uint32_t memorySize(const Section& section) {
        return section.memorySize ? section.memorySize : section.fileSize;
    }

    /// Returns the size of the section's content in the file.
    static std::uint32_t backedSize(const Section& section) {
        return std::min(section.fileSize, memorySize(section));
    }

    const Section* sectionOf(std::uint64_t address) const {
        for (const Section& section : sections)
            if (address >= section.address && address - section.address < memorySize(section))
                return &section;
        return nullptr;
    }

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

    template <class T>
    std::optional<T> readAt(std::uint64_t address) {
        const auto offset = offsetOf(address, sizeof(T));
        return offset ? file.read<T>(*offset) : std::nullopt;
    }

    std::optional<std::string> textAt(std::uint64_t address) {
        const auto offset = offsetOf(address, 1);
        return offset ? file.text(*offset) : std::nullopt;
    }

    bool readImports() {
        const Directory imports = directory(importDirectory);
        if (!imports.address)
            return true;
        for (std::size_t index = 0; index < maximumNeeded; ++index) {
            const auto import = readAt<Import>(imports.address + index * sizeof(Import));
            if (!import)
                return damaged(L"the table of what it needs is cut off");
            if (!import->name)
                return true;
            const auto name = textAt(import->name);
            if (!name)
                return damaged(L"the name of a library that it needs is missing");
            image.needed.push_back(*name);
        }
        return true;
    }

    /// The exports, if the file has any and their tables are in it. Tables that lead out of the
    /// file are a fault, unless they are empty.
    std::optional<Exports> readExports(const Directory& place) {
        if (!place.address)
            return std::nullopt;
        const auto exports = readAt<Exports>(place.address);
        if (!exports) {
            damaged(L"the table of exports makes no sense");
            return std::nullopt;
        }
        if (place.size < sizeof(Exports) || !offsetOf(place.address, place.size) ||
            !offsetOf(exports->functions, exports->functionCount * 4ull) ||
            !offsetOf(exports->names, exports->nameCount * 4ull) ||
            !offsetOf(exports->ordinals, exports->nameCount * 2ull)) {
            if (exports->nameCount)
                damaged(L"the table of exports makes no sense");
            return std::nullopt;
        }
        return exports;
    }

    void findEntryPoint() {
        const Directory place = directory(exportDirectory);
        const auto exports = readExports(place);
        if (!exports)
            return;
        const Found entryPoint = find(*exports, entryPointName);
        if (!entryPoint.sound)
            damaged(L"the table of exports makes no sense");
        if (!entryPoint.address)
            return;
        judge(*entryPoint.address, place);
        // The system does not look for this name, so a fault on the way to it is no damage.
        if (const auto stamp = find(*exports, stampName).address;
            stamp && !isForwarded(*stamp, place))
            image.stamp = validStamp(readAt<ComponentStamp>(*stamp));
    }

    /// The result of a search for an exported name.
    struct Found {
        std::optional<std::uint32_t> address; ///< of the symbol; empty if the name is not exported
        bool sound = true;                    ///< false if the search left the file
    };

    /// The system uses binary search too: in unsorted names it does not find the symbol either.
    Found find(const Exports& exports, std::string_view wanted) {
        std::uint32_t first = 0;
        for (std::uint32_t count = exports.nameCount; count > 0;) {
            const std::uint32_t middle = first + (count - 1) / 2;
            const auto name = readAt<std::uint32_t>(exports.names + middle * 4ull);
            const auto order = name ? compareName(*name, wanted) : std::nullopt;
            if (!order)
                return {std::nullopt, false};
            if (*order == 0) {
                const auto address = addressOf(exports, middle);
                return {address, address.has_value()};
            }
            const std::uint32_t before = middle - first;
            first = *order < 0 ? middle + 1 : first;
            count = *order < 0 ? count - before - 1 : before;
        }
        return {};
    }

    /// Returns the address of the symbol with the name at `index`.
    std::optional<std::uint32_t> addressOf(const Exports& exports, std::uint32_t index) {
        const auto ordinal = readAt<std::uint16_t>(exports.ordinals + index * 2ull);
        if (!ordinal || *ordinal >= exports.functionCount)
            return std::nullopt;
        return readAt<std::uint32_t>(exports.functions + *ordinal * 4ull);
    }

    /// Compares the name at `address` with `wanted` like `strcmp`; `std::nullopt` if the name is
    /// truncated before the result is known.
    std::optional<int> compareName(std::uint64_t address, std::string_view wanted) {
        char text[64] = {};
        const std::size_t length = wanted.size() + 1;
        static_assert(std::string_view(entryPointName).size() < sizeof text &&
                      std::string_view(stampName).size() < sizeof text);
        const Section* section = sectionOf(address);
        const auto offset = offsetOf(address, 1);
        if (!section || !offset)
            return std::nullopt;
        const std::uint64_t left = backedSize(*section) - (address - section->address);
        const auto present = static_cast<std::size_t>(std::min<std::uint64_t>(length, left));
        if (!file.read(*offset, text, present))
            return std::nullopt;
        if (!std::memchr(text, 0, present) && present < length &&
            std::memcmp(text, wanted.data(), present) == 0)
            return std::nullopt;
        return std::strncmp(text, wanted.data(), length);
    }

    /// An address inside the export table is a forwarder: the name of another library's function.
    static bool isForwarded(std::uint32_t address, const Directory& exports) {
        return address >= exports.address && address - exports.address < exports.size;
    }

    void judge(std::uint32_t function, const Directory& exports) {
        const Section* section = sectionOf(function);
        const bool code = section && (section->flags & executableFlag);
        image.entryPoint = code && !isForwarded(function, exports)
                               ? LibraryImage::EntryPoint::function
                               : LibraryImage::EntryPoint::noFunction;
    }

    /// Returns whether there is a manifest that applies to the library: resource 2 of type 24.
    bool findManifest() {
        const Directory resources = directory(resourceDirectory);
        if (!resources.address)
            return false;
        constexpr std::uint32_t manifestType = 24, isolationAware = 2;
        const auto type = resourceEntry(resources.address, 0, manifestType);
        return type && (*type >> 31) &&
               resourceEntry(resources.address, *type & 0x7FFFFFFF, isolationAware);
    }

    std::optional<std::uint32_t> resourceEntry(std::uint64_t base, std::uint64_t table,
                                               std::uint32_t id) {
        const auto head = readAt<ResourceTable>(base + table);
        if (!head)
            return std::nullopt;
        const std::size_t count = std::min<std::size_t>(
            std::size_t{head->namedCount} + head->numberedCount, maximumResources);
        for (std::size_t index = 0; index < count; ++index) {
            const auto entry = readAt<ResourceEntry>(base + table + sizeof(ResourceTable) +
                                                     index * sizeof(ResourceEntry));
            if (!entry)
                return std::nullopt;
            if (entry->id == id)
                return entry->offset;
        }
        return std::nullopt;
    }

    FileBytes& file;
    LibraryImage& image;
    FileHeader header{};
    std::uint64_t optional = 0;
    std::vector<Section> sections;
};

} // namespace

void readPeImage(FileBytes& file, LibraryImage& image) {
    PeReader(file, image).read();
}

std::string peSections(FileBytes& file, std::string_view prefix) {
    LibraryImage image;
    return PeReader(file, image).sectionContents(prefix);
}

std::vector<std::string> exportedPeNames(FileBytes& file) {
    LibraryImage image;
    PeReader reader(file, image);
    reader.read();
    return reader.exportedNames();
}

} // namespace Mz::Tools
