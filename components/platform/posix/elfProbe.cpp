// SPDX-License-Identifier: BSL-1.0
/// Looks up a symbol in an ELF file as the loader would.
///
/// The check reads the headers, the dynamic section and the hash table, and follows one chain of
/// that table, so it costs a few reads in a library of any size. All offsets, counts and addresses
/// are checked against the file, because the loader crashes on some damaged files.
#include "components/platform/posix/elfProbe.h"

#include "components/platform/elfMachine.h"
#include "components/platform/fileBlocks.h"

#include <algorithm>
#include <array>
#include <cerrno>
#include <cstdint>
#include <cstring>
#include <elf.h>
#include <optional>
#include <string_view>
#include <sys/stat.h>
#include <type_traits>
#include <unistd.h>
#include <vector>

namespace Mz::platform {

namespace {

/// Limits that bound the work for a hostile file. Real libraries are far below them.
constexpr std::size_t maximumSegments = 1024;
constexpr std::size_t maximumDynamicEntries = 4096;
constexpr std::size_t maximumChainLength = 4096;

/// The bytes of the file of a descriptor, which stays open.
class DescriptorSource final : public ByteSource {
  public:
    explicit DescriptorSource(int descriptor) : descriptor(descriptor) {
        struct stat status;
        if (::fstat(descriptor, &status) == 0)
            fileSize = static_cast<std::uint64_t>(status.st_size);
        else
            failed = true;
    }

    /// Returns whether the system could not read something. The file is not at fault then.
    bool hasFailed() const { return failed; }

    std::uint64_t size() const override { return fileSize; }

    std::size_t read(std::uint64_t offset, void* data, std::size_t length) override {
        std::size_t done = 0;
        while (done < length) {
            const ssize_t got = ::pread(descriptor, static_cast<char*>(data) + done, length - done,
                                        static_cast<off_t>(offset + done));
            if (got > 0)
                done += static_cast<std::size_t>(got);
            else if (got == 0)
                break;
            else if (errno != EINTR) {
                failed = true;
                break;
            }
        }
        return done;
    }

  private:
    int descriptor;
    std::uint64_t fileSize = 0;
    bool failed = false;
};

/// The tables for symbol lookup, by their addresses in the loaded library.
struct DynamicTables {
    std::uint64_t symbols = 0;
    std::uint64_t strings = 0;
    std::uint64_t stringsSize = 0;
    std::uint64_t gnuHash = 0;
    std::uint64_t hash = 0;
    /// The highest position in the string table at which the loader reads a name.
    std::uint64_t lastName = 0;
    bool isProgram = false; ///< a position-independent executable, which cannot be loaded
};

class ElfLibrary {
  public:
    /// The headers are within the first bytes, and of the symbols one hash chain is read.
    explicit ElfLibrary(ByteSource& source) : file(source, 1024) {}

    bool exports(const char* symbol) {
        if (!readHeaders() || !readDynamicTables())
            return false;
        return (tables.gnuHash ? foundByGnuHash(symbol) : foundByHash(symbol)) &&
               namesAreTerminated();
    }

  private:
    bool readHeaders() {
        const auto header = file.read<Elf64_Ehdr>(0);
        if (!header || std::memcmp(header->e_ident, ELFMAG, SELFMAG) != 0 ||
            header->e_ident[EI_CLASS] != ELFCLASS64 || header->e_ident[EI_DATA] != nativeElfOrder ||
            header->e_type != ET_DYN || header->e_machine != nativeElfMachine ||
            header->e_phentsize != sizeof(Elf64_Phdr) || header->e_phnum > maximumSegments)
            return false;
        // The section headers are usually at the end of the file, so a truncated file lacks them.
        if (header->e_shnum != 0 &&
            !file.reaches(header->e_shoff, header->e_shnum * std::uint64_t{header->e_shentsize}))
            return false;
        for (std::size_t index = 0; index < header->e_phnum; ++index) {
            const auto segment =
                file.read<Elf64_Phdr>(header->e_phoff + index * sizeof(Elf64_Phdr));
            if (!segment)
                return false;
            // The system also maps parts that the file lacks. Accessing them kills the process.
            if (segment->p_type == PT_LOAD && !file.reaches(segment->p_offset, segment->p_filesz))
                return false;
            if (segment->p_type == PT_LOAD)
                loadSegments.push_back(*segment);
            else if (segment->p_type == PT_DYNAMIC)
                dynamic = *segment;
        }
        return dynamic.has_value();
    }

    bool readDynamicTables() {
        const std::size_t count =
            std::min<std::uint64_t>(dynamic->p_filesz / sizeof(Elf64_Dyn), maximumDynamicEntries);
        for (std::size_t index = 0; index < count; ++index) {
            const auto entry = file.read<Elf64_Dyn>(dynamic->p_offset + index * sizeof(Elf64_Dyn));
            if (!entry)
                return false;
            if (entry->d_tag == DT_NULL)
                break;
            store(*entry);
        }
        return !tables.isProgram && tables.symbols && tables.strings &&
               (tables.gnuHash || tables.hash);
    }

    void store(const Elf64_Dyn& entry) {
        switch (entry.d_tag) {
        case DT_SYMTAB: tables.symbols = entry.d_un.d_ptr; break;
        case DT_STRTAB: tables.strings = entry.d_un.d_ptr; break;
        case DT_STRSZ: tables.stringsSize = entry.d_un.d_val; break;
        case DT_GNU_HASH: tables.gnuHash = entry.d_un.d_ptr; break;
        case DT_FLAGS_1: tables.isProgram = (entry.d_un.d_val & DF_1_PIE) != 0; break;
        case DT_HASH: tables.hash = entry.d_un.d_ptr; break;
        case DT_NEEDED:
        case DT_SONAME:
        case DT_RPATH:
        case DT_RUNPATH: tables.lastName = std::max(tables.lastName, entry.d_un.d_val); break;
        default: break;
        }
    }

    /// Returns whether all names that the loader reads from the string table end inside it. The
    /// loader does not check that.
    bool namesAreTerminated() {
        if (tables.lastName >= tables.stringsSize)
            return false;
        const std::optional<std::uint64_t> offset = offsetOf(tables.strings, tables.stringsSize);
        return offset && file.read<char>(*offset + tables.stringsSize - 1) == '\0';
    }

    /// Returns the `T` that the loaded library would contain at `address`.
    template <class T>
    std::optional<T> readAt(std::uint64_t address) {
        const std::optional<std::uint64_t> offset = offsetOf(address, sizeof(T));
        if (!offset)
            return std::nullopt;
        return file.read<T>(*offset);
    }

    /// Returns the offset in the file of the `size` bytes at `address`, if one segment contains all
    /// of them.
    std::optional<std::uint64_t> offsetOf(std::uint64_t address, std::size_t size) const {
        for (const Elf64_Phdr& segment : loadSegments) {
            if (address < segment.p_vaddr)
                continue;
            const std::uint64_t inside = address - segment.p_vaddr;
            if (inside <= segment.p_filesz && size <= segment.p_filesz - inside)
                return segment.p_offset + inside;
        }
        return std::nullopt;
    }

    bool foundByGnuHash(std::string_view name) {
        struct Header {
            std::uint32_t bucketCount, firstSymbol, bloomCount, bloomShift;
        };
        const auto header = readAt<Header>(tables.gnuHash);
        if (!header || !header->bucketCount || !header->bloomCount)
            return false;
        std::uint32_t hash = 5381;
        for (const char c : name)
            hash = hash * 33 + static_cast<unsigned char>(c);

        const std::uint64_t bloom = tables.gnuHash + sizeof(Header);
        const auto word = readAt<std::uint64_t>(bloom + (hash / 64 % header->bloomCount) * 8ull);
        if (!word ||
            !(*word >> (hash % 64) & *word >> (hash >> (header->bloomShift % 32) & 63) & 1))
            return false;

        const std::uint64_t buckets = bloom + header->bloomCount * 8ull;
        const std::uint64_t chains = buckets + header->bucketCount * 4ull;
        const auto bucket = readAt<std::uint32_t>(buckets + hash % header->bucketCount * 4ull);
        if (!bucket || *bucket < header->firstSymbol)
            return false;
        for (std::size_t step = 0; step < maximumChainLength; ++step) {
            const std::uint64_t index = *bucket + step;
            const auto entry = readAt<std::uint32_t>(chains + (index - header->firstSymbol) * 4);
            if (!entry)
                return false;
            if ((*entry | 1) == (hash | 1) && isExportedFunction(index, name))
                return true;
            if (*entry & 1)
                return false;
        }
        return false;
    }

    bool foundByHash(std::string_view name) {
        using Entry = std::conditional_t<hasWideElfHash, std::uint64_t, std::uint32_t>;
        struct Header {
            Entry bucketCount, chainCount;
        };
        const auto header = readAt<Header>(tables.hash);
        if (!header || !header->bucketCount)
            return false;
        std::uint32_t hash = 0;
        for (const char c : name) {
            hash = (hash << 4) + static_cast<unsigned char>(c);
            hash = (hash ^ (hash >> 28 << 28) >> 24) & 0x0FFFFFFF;
        }
        const std::uint64_t buckets = tables.hash + sizeof(Header);
        const std::uint64_t chains = buckets + header->bucketCount * sizeof(Entry);
        auto index = readAt<Entry>(buckets + hash % header->bucketCount * sizeof(Entry));
        for (std::size_t step = 0; index && *index && step < maximumChainLength; ++step) {
            if (isExportedFunction(*index, name))
                return true;
            index = readAt<Entry>(chains + *index * sizeof(Entry));
        }
        return false;
    }

    bool isExportedFunction(std::uint64_t index, std::string_view name) {
        const auto symbol = readAt<Elf64_Sym>(tables.symbols + index * sizeof(Elf64_Sym));
        if (!symbol || symbol->st_shndx == SHN_UNDEF)
            return false;
        const unsigned int type = ELF64_ST_TYPE(symbol->st_info);
        const unsigned int binding = ELF64_ST_BIND(symbol->st_info);
        const unsigned int visibility = ELF64_ST_VISIBILITY(symbol->st_other);
        // Functions written in assembly often have no type.
        return (type == STT_FUNC || type == STT_GNU_IFUNC || type == STT_NOTYPE) &&
               binding != STB_LOCAL && visibility != STV_HIDDEN && visibility != STV_INTERNAL &&
               isName(symbol->st_name, name);
    }

    /// Returns whether the string table contains `name` and its terminator at `position`.
    bool isName(std::uint64_t position, std::string_view name) {
        if (position >= tables.stringsSize || name.size() >= tables.stringsSize - position)
            return false;
        std::array<char, 64> text;
        const std::size_t size = name.size() + 1;
        const auto offset = offsetOf(tables.strings + position, size);
        return size <= text.size() && offset && file.read(*offset, text.data(), size) &&
               std::memcmp(text.data(), name.data(), name.size()) == 0 && !text[name.size()];
    }

    FileBlocks file;
    std::vector<Elf64_Phdr> loadSegments;
    std::optional<Elf64_Phdr> dynamic;
    DynamicTables tables;
};

} // namespace

ExportState elfExportsFunction(int descriptor, const char* symbol) {
    DescriptorSource source(descriptor);
    if (ElfLibrary(source).exports(symbol))
        return ExportState::exported;
    return source.hasFailed() ? ExportState::unknown : ExportState::absent;
}

} // namespace Mz::platform
