/// What a file says of itself as a library or program, read from its bytes alone.
///
/// Both formats are read on every system, so that a library for the wrong one is called by its
/// name. Nothing in the file is trusted, and nothing of it is run.
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

/// Reads pieces of a file through two remembered blocks.
class FileBytes {
  public:
    explicit FileBytes(const std::filesystem::path& path);

    bool isOpen() const { return opened; }
    std::uint64_t size() const { return fileSize; }

    /// Whether the file has all of these bytes.
    bool reaches(std::uint64_t offset, std::uint64_t length) const {
        return length <= fileSize && offset <= fileSize - length;
    }

    /// The `T` at `offset`; nothing when the file ends before it is whole.
    template <class T>
    std::optional<T> read(std::uint64_t offset) {
        static_assert(std::is_trivially_copyable_v<T>);
        T value;
        if (!read(offset, &value, sizeof value))
            return std::nullopt;
        return value;
    }

    /// False when the file ends before. No piece is larger than a block.
    bool read(std::uint64_t offset, void* data, std::size_t length);

    /// The text at `offset` up to its NUL; nothing when it is longer than any sensible name.
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
    std::wstring otherProcessor; ///< its name, when it is not x86-64
    std::wstring damage;         ///< what is wrong, when something is
    EntryPoint entryPoint = EntryPoint::absent;
    std::string ownName;              ///< by which others need it, where it carries one (SONAME)
    std::vector<std::string> needed;  ///< the libraries that the system loads with it
    std::vector<std::string> rpath;   ///< folders for all that is loaded through it, as written
    std::vector<std::string> runpath; ///< folders for what it needs itself
    bool hasManifest = false;         ///< describes surroundings of its own to load in
};

/// Reads the file, which must be a regular one.
LibraryImage readLibraryImage(const std::filesystem::path& path);

/// What `readLibraryImage` is made of: each fills `image` from a file that begins as its format
/// does, up to the first thing that is wrong.
void readElfImage(FileBytes& file, LibraryImage& image);
void readPeImage(FileBytes& file, LibraryImage& image);

/// The symbols that others must define before the library at `path`, in the format of Linux, can be
/// loaded. Leaves out those that may be missing (weak), and those that it wants in a certain
/// version: these can only come from the libraries that it needs.
std::vector<std::string> wantedSymbols(const std::filesystem::path& path);

/// Removes from `names` what the library at `path`, in the format of Linux, defines for others.
/// False when it cannot be read or is damaged.
bool removeDefined(const std::filesystem::path& path, std::set<std::string>& names);

/// The entry point of component libraries.
inline constexpr const char* entryPointName = "QrGetComponentDescription";

} // namespace Mz::Tools
