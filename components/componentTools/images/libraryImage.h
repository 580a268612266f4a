// SPDX-License-Identifier: BSL-1.0
/// Reads ELF and PE libraries and programs without running any of their code.
///
/// Both formats are read on every system, so that a library for the wrong system is recognised. The
/// readers do not trust the file: every offset, size and count is checked.
#pragma once

#include "components/componentManager/componentStamp.h"
#include "components/platform/fileBlocks.h"

#include <cstdint>
#include <filesystem>
#include <fstream>
#include <optional>
#include <set>
#include <string>
#include <string_view>
#include <vector>

namespace Mz::Tools {

/// A file and its bytes, for small reads at any offset.
class FileBytes {
  public:
    explicit FileBytes(const std::filesystem::path& path) : source(path), blocks(source) {}

    bool isOpen() const { return source.opened; }
    /// Returns whether the system could not read something. The file is not at fault then.
    bool hasFailed() const { return source.failed; }
    std::uint64_t size() const { return source.bytes; }

    /// Returns whether the file contains all of these bytes.
    bool reaches(std::uint64_t offset, std::uint64_t length) const {
        return blocks.reaches(offset, length);
    }

    /// Returns the `T` at `offset`; `std::nullopt` if the file ends before its end.
    template <class T>
    std::optional<T> read(std::uint64_t offset) {
        return blocks.read<T>(offset);
    }

    /// Reads `length` bytes, at most `platform::FileBlocks::blockSize`. Returns false if it cannot
    /// read all of them.
    bool read(std::uint64_t offset, void* data, std::size_t length) {
        return blocks.read(offset, data, length);
    }

    /// Reads any number of bytes, past the cached blocks. Returns false if it cannot read all of
    /// them.
    bool readLong(std::uint64_t offset, void* data, std::size_t length) {
        return reaches(offset, length) && source.read(offset, data, length) == length;
    }

    /// Returns the NUL-terminated text at `offset`; `std::nullopt` if it is not terminated or has
    /// 4096 bytes or more.
    std::optional<std::string> text(std::uint64_t offset);

  private:
    struct Source final : platform::ByteSource {
        explicit Source(const std::filesystem::path& path);
        std::uint64_t size() const override { return bytes; }
        std::size_t read(std::uint64_t offset, void* data, std::size_t length) override;

        std::ifstream stream;
        bool opened = false;
        bool failed = false;
        std::uint64_t bytes = 0;
    };

    Source source;
    platform::FileBlocks blocks;
};

enum class ImageFormat { none, elf, pe };

struct LibraryImage {
    enum class Kind { other, library, program };
    enum class EntryPoint { absent, function, noFunction };

    bool readable = false; ///< false if it cannot be opened, or not be read completely
    ImageFormat format = ImageFormat::none;
    Kind kind = Kind::other;
    std::wstring otherProcessor; ///< the name of its processor; empty if this is built for it
    std::wstring damage;         ///< the first fault in the file; empty if none was found
    EntryPoint entryPoint = EntryPoint::absent;
    std::string ownName;             ///< the SONAME (ELF); empty if there is none
    std::vector<std::string> needed; ///< its direct dependencies
    std::vector<std::string> rpath;  ///< DT_RPATH, unexpanded: applies to indirect dependencies too
    std::vector<std::string> runpath; ///< DT_RUNPATH, unexpanded: for direct dependencies
    bool hasManifest = false;         ///< has a manifest, which changes how dependencies are found
    /// The stamp of a library with the entry point, if it exports a valid one.
    std::optional<ComponentStamp> stamp;
};

/// Returns the image of a file, which must be a regular file: opening a pipe would block.
LibraryImage readLibraryImage(const std::filesystem::path& path);
LibraryImage readLibraryImage(FileBytes& file);

/// The parts of `readLibraryImage`. Each fills `image` from a file with the magic number of its
/// format, and stops at the first fault.
void readElfImage(FileBytes& file, LibraryImage& image);
std::vector<std::string> exportedElfNames(FileBytes& file);
std::string elfSections(FileBytes& file, std::string_view prefix);
void readPeImage(FileBytes& file, LibraryImage& image);
std::vector<std::string> exportedPeNames(FileBytes& file);
std::string peSections(FileBytes& file, std::string_view prefix);

/// Returns the symbols that other files must define before the ELF library at `path` can be loaded.
/// Skips weak symbols, which may be undefined, and symbols with a version, which can only come from
/// its dependencies.
std::vector<std::string> wantedSymbols(const std::filesystem::path& path);

/// Removes from `names` the symbols that the ELF library at `path` exports.
/// \return false if the library cannot be read or is damaged
bool removeDefined(const std::filesystem::path& path, std::set<std::string>& names);

/// Returns the stamp if it is one that can be judged: magic number, layout and size are known.
std::optional<ComponentStamp> validStamp(const std::optional<ComponentStamp>& stamp);

/// Returns the names that the library at `path` exports. Of an ELF library, those of weak symbols
/// are left out: templates and inline functions of its headers. Empty if it cannot be read.
std::vector<std::string> exportedNames(const std::filesystem::path& path);

/// Returns the content of all sections of a library or program whose names begin with `prefix`, one
/// after the other. Each begins at a multiple of 8. Empty if the file has none or cannot be read.
/// No more than `mostSectionBytes`.
std::string sectionsOf(const std::filesystem::path& path, std::string_view prefix);
std::string sectionsOf(FileBytes& file, std::string_view prefix);

/// Appends a section that the file contains as a whole. Returns false if it is missing or too long.
bool appendSection(FileBytes& file, std::uint64_t offset, std::uint64_t size, std::string& content);

/// The largest content that `sectionsOf` returns: far more than the fingerprints of any library.
inline constexpr std::size_t mostSectionBytes = std::size_t{4} << 20;

/// Returns whether every component library may export this name.
bool isComponentExport(const std::string& name);

/// The names that component libraries export: the entry point, and the stamp.
inline constexpr const char* entryPointName = "QrGetComponentDescription";
inline constexpr const char* stampName = "MzComponentStamp";

} // namespace Mz::Tools
