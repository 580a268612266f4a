/// Libraries and programs in the format of Windows.
#include "components/componentTools/libraryImage.h"

#include <algorithm>
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
constexpr std::uint32_t codeSection = 0x20000020; // contains code, or may be run
constexpr std::size_t exportDirectory = 0, importDirectory = 1, resourceDirectory = 2;

/// Limits that no real library comes near; they bound the work that a hostile one can cause.
constexpr std::size_t maximumSections = 96;
constexpr std::size_t maximumNeeded = 1024;
constexpr std::uint32_t maximumNames = 1u << 20;
constexpr std::size_t maximumResources = 4096;

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

  private:
    bool damaged(const wchar_t* what) {
        image.damage = what;
        return false;
    }

    bool readHeader() {
        const auto start = file.read<std::uint32_t>(0x3C);
        const auto signature = start ? file.read<std::uint32_t>(*start) : std::nullopt;
        if (!signature || *signature != 0x4550)
            return false; // A program for a forerunner of the system, or a text that begins with
                          // MZ.
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
        if (!magic || *magic != wideOptionalHeader)
            return damaged(L"the header makes no sense");
        return true;
    }

    bool readSections() {
        if (header.sectionCount > maximumSections)
            return damaged(L"the table of sections makes no sense");
        const std::uint64_t table = optional + header.optionalSize;
        for (std::size_t index = 0; index < header.sectionCount; ++index) {
            const auto section = file.read<Section>(table + index * sizeof(Section));
            if (!section)
                return damaged(L"the table of sections is cut off");
            if (section->fileSize && !file.reaches(section->offset, section->fileSize))
                return damaged(L"the end is missing");
            sections.push_back(*section);
        }
        return true;
    }

    Directory directory(std::size_t index) {
        const auto count = file.read<std::uint32_t>(optional + 108);
        const std::uint64_t offset = 112 + index * sizeof(Directory);
        if (!count || index >= *count || offset + sizeof(Directory) > header.optionalSize)
            return {0, 0};
        return file.read<Directory>(optional + offset).value_or(Directory{0, 0});
    }

    const Section* sectionOf(std::uint64_t address) const {
        for (const Section& section : sections) {
            const std::uint64_t size = std::max(section.memorySize, section.fileSize);
            if (address >= section.address && address - section.address < size)
                return &section;
        }
        return nullptr;
    }

    std::optional<std::uint64_t> offsetOf(std::uint64_t address, std::size_t size) const {
        const Section* section = sectionOf(address);
        if (!section)
            return std::nullopt;
        const std::uint64_t inside = address - section->address;
        if (inside > section->fileSize || size > section->fileSize - inside)
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

    void findEntryPoint() {
        const Directory directoryOfExports = directory(exportDirectory);
        const auto exports = readAt<Exports>(directoryOfExports.address);
        if (!directoryOfExports.address || !exports)
            return;
        // Sorted by rule, but the few names of a library are quickly looked through as well.
        const std::uint32_t count = std::min(exports->nameCount, maximumNames);
        for (std::uint32_t index = 0; index < count; ++index) {
            const auto name = readAt<std::uint32_t>(exports->names + index * 4ull);
            if (!name)
                return;
            if (!isEntryPointName(*name))
                continue;
            const auto ordinal = readAt<std::uint16_t>(exports->ordinals + index * 2ull);
            const auto function = ordinal
                                      ? readAt<std::uint32_t>(exports->functions + *ordinal * 4ull)
                                      : std::nullopt;
            if (function)
                judge(*function, directoryOfExports);
            return;
        }
    }

    bool isEntryPointName(std::uint64_t address) {
        constexpr std::string_view wanted(entryPointName);
        char text[64];
        static_assert(wanted.size() < sizeof text);
        const auto offset = offsetOf(address, wanted.size() + 1);
        return offset && file.read(*offset, text, wanted.size() + 1) &&
               std::string_view(text, wanted.size() + 1) ==
                   std::string_view(entryPointName, wanted.size() + 1);
    }

    /// An address among the exports themselves is the name of another library's function.
    void judge(std::uint32_t function, const Directory& exports) {
        const bool forwarded =
            function >= exports.address && function - exports.address < exports.size;
        const Section* section = sectionOf(function);
        const bool code = section && (section->flags & codeSection);
        image.entryPoint = code && !forwarded ? LibraryImage::EntryPoint::function
                                              : LibraryImage::EntryPoint::noFunction;
    }

    /// Whether there is a manifest for the library's own surroundings: resource 2 of type 24.
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

} // namespace Mz::Tools
