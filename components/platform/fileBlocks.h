// SPDX-License-Identifier: BSL-1.0
/// Small reads from a file that may be damaged or hostile, for the readers of library formats:
/// those of this layer and those of libMZcomponentTools.
#pragma once

#include <array>
#include <cstddef>
#include <cstdint>
#include <optional>
#include <type_traits>

namespace Mz::platform {

/// The bytes of an open file, read at any offset.
class ByteSource {
  public:
    /// Returns the size of the file.
    virtual std::uint64_t size() const = 0;

    /// Reads up to `length` bytes at `offset` into `data`. Returns the number of bytes read, which
    /// is smaller than `length` only at the end of the file and after an error.
    virtual std::size_t read(std::uint64_t offset, void* data, std::size_t length) = 0;

  protected:
    ~ByteSource() = default;
};

/// Reads pieces of a file through two cached blocks. The tables of a library that are read together
/// are close to each other in the file, so most pieces cost no system call.
class FileBlocks {
  public:
    /// The maximum size of a piece.
    static constexpr std::size_t blockSize = 4096;

    /// Creates a reader of `file`, which must outlive it. Reads `firstSize` bytes, at most
    /// `blockSize`, where no block ends, and a whole block where one does. Few bytes are better for
    /// a reader that needs little of each table: the file is rarely in the processor's cache, so
    /// that copying a whole block costs as much as another system call.
    explicit FileBlocks(ByteSource& file, std::size_t firstSize = blockSize)
        : file(file), fileSize(file.size()), firstSize(firstSize) {}

    /// Returns the `T` at `offset`, or `std::nullopt` if the file ends before.
    template <class T>
    std::optional<T> read(std::uint64_t offset) {
        static_assert(std::is_trivially_copyable_v<T> && sizeof(T) <= blockSize);
        T value;
        if (!read(offset, &value, sizeof value))
            return std::nullopt;
        return value;
    }

    /// Reads exactly `size` bytes, at most `blockSize`. Returns false if the file ends before.
    bool read(std::uint64_t offset, void* data, std::size_t size);

    /// Returns whether the file contains all of these bytes.
    bool reaches(std::uint64_t offset, std::uint64_t size) const {
        return size <= fileSize && offset <= fileSize - size;
    }

  private:
    struct Block {
        std::uint64_t offset = 0;
        std::size_t size = 0;
        std::array<char, blockSize> bytes;

        bool contains(std::uint64_t position, std::size_t length) const {
            return position >= offset && position - offset <= size &&
                   length <= size - (position - offset);
        }
    };

    /// Returns whether a block reaches `offset`, so that a table is read from its begin to its end.
    bool goesOn(std::uint64_t offset) const;
    Block* blockWith(std::uint64_t offset, std::size_t size);

    ByteSource& file;
    std::uint64_t fileSize;
    std::size_t firstSize;
    std::array<Block, 2> blocks;
    std::size_t older = 0; ///< the block to fill next
};

} // namespace Mz::platform
