// SPDX-License-Identifier: BSL-1.0
/// Reads ELF and PE libraries and programs without running any of their code.
///
/// Both formats are read on every system, so that a library for the wrong system is recognised. The
/// readers do not trust the file: every offset, size and count is checked.
#pragma once

#include <array>
#include <cstdint>
#include <cstring>
#include <filesystem>
#include <fstream>
#include <optional>
#include <set>
#include <string>
#include <type_traits>
#include <vector>

namespace Mz::Tools {

/// Reads pieces of a file through two cached blocks.
class FileBytes {
  public:
    explicit FileBytes(const std::filesystem::path& path);

    bool isOpen() const { return opened; }
    std::uint64_t size() const { return fileSize; }

    /// Returns whether the file contains all of these bytes.
    bool reaches(std::uint64_t offset, std::uint64_t length) const {
        return length <= fileSize && offset <= fileSize - length;
    }

    /// Returns the `T` at `offset`; `std::nullopt` if the file ends before its end.
    template <class T>
    std::optional<T> read(std::uint64_t offset) {
        static_assert(std::is_trivially_copyable_v<T>);
        T value;
        if (!read(offset, &value, sizeof value))
            return std::nullopt;
        return value;
    }

    /// Reads `length` bytes, at most 8192. Returns false if it cannot read all of them.
    bool read(std::uint64_t offset, void* data, std::size_t length);

    /// Returns the NUL-terminated text at `offset`; `std::nullopt` if it is not terminated or has
    /// 4096 bytes or more.
    std::optional<std::string> text(std::uint64_t offset);

  private:
    struct Block {
        std::uint64_t offset = 0;
        std::size_t size = 0;
        std::array<char, 8192> bytes;
    };
    bool load(Block& block, std::uint64_t offset);

    std::ifstream stream;
    bool opened = false;
    std::uint64_t fileSize = 0;
    std::array<Block, 2> blocks;
    std::size_t older = 0; ///< the block to fill next
};

enum class ImageFormat { none, elf, pe };

struct LibraryImage {
    enum class Kind { other, library, program };
    enum class EntryPoint { absent, function, noFunction };

    bool readable = false;
    ImageFormat format = ImageFormat::none;
    Kind kind = Kind::other;
    std::wstring otherProcessor; ///< the name of its processor; empty for x86-64
    std::wstring damage;         ///< the first fault in the file; empty if none was found
    EntryPoint entryPoint = EntryPoint::absent;
    std::string ownName;             ///< the SONAME (ELF); empty if there is none
    std::vector<std::string> needed; ///< its direct dependencies
    std::vector<std::string> rpath;  ///< DT_RPATH, unexpanded: applies to indirect dependencies too
    std::vector<std::string> runpath; ///< DT_RUNPATH, unexpanded: for direct dependencies
    bool hasManifest = false;         ///< has a manifest, which changes how dependencies are found
};

/// Returns the image of a file, which must be a regular file: opening a pipe would block.
LibraryImage readLibraryImage(const std::filesystem::path& path);

/// The parts of `readLibraryImage`. Each fills `image` from a file with the magic number of its
/// format, and stops at the first fault.
void readElfImage(FileBytes& file, LibraryImage& image);
std::vector<std::string> exportedElfNames(FileBytes& file);
void readPeImage(FileBytes& file, LibraryImage& image);
std::vector<std::string> exportedPeNames(FileBytes& file);

/// Returns the symbols that other files must define before the ELF library at `path` can be loaded.
/// Skips weak symbols, which may be undefined, and symbols with a version, which can only come from
/// its dependencies.
std::vector<std::string> wantedSymbols(const std::filesystem::path& path);

/// Removes from `names` the symbols that the ELF library at `path` exports.
/// \return false if the library cannot be read or is damaged
bool removeDefined(const std::filesystem::path& path, std::set<std::string>& names);

/// Returns the names that the library at `path` exports. Of an ELF library, those of weak symbols
/// are left out: templates and inline functions of its headers. Empty if it cannot be read.
std::vector<std::string> exportedNames(const std::filesystem::path& path);

/// Returns whether every component library may export this name.
bool isComponentExport(const std::string& name);

/// The name of the entry point of component libraries.
inline constexpr const char* entryPointName = "QrGetComponentDescription";

} // namespace Mz::Tools
