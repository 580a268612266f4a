// SPDX-License-Identifier: BSL-1.0
/// Caches two blocks of a file.
///
/// A read that neither block contains refills the block that was not used last. Two blocks suffice,
/// because the readers alternate between two tables at a time.
#include "components/platform/fileBlocks.h"

#include <algorithm>
#include <cstring>

namespace Mz::platform {

bool FileBlocks::read(std::uint64_t offset, void* data, std::size_t size) {
    Block* block = blockWith(offset, size);
    if (!block) {
        if (size > blockSize || !reaches(offset, size))
            return false;
        const std::size_t wanted = goesOn(offset) ? blockSize : std::max(size, firstSize);
        block = &blocks[older];
        block->offset = offset;
        // Not past the end: the source would need another system call to detect the end.
        const std::uint64_t rest = std::min<std::uint64_t>(fileSize - offset, wanted);
        block->size = file.read(offset, block->bytes.data(), static_cast<std::size_t>(rest));
        if (!block->contains(offset, size))
            return false;
    }
    older = block == &blocks[0] ? 1 : 0;
    std::memcpy(data, block->bytes.data() + (offset - block->offset), size);
    return true;
}

FileBlocks::Block* FileBlocks::blockWith(std::uint64_t offset, std::size_t size) {
    for (Block& block : blocks)
        if (block.contains(offset, size))
            return &block;
    return nullptr;
}

bool FileBlocks::goesOn(std::uint64_t offset) const {
    return std::any_of(blocks.begin(), blocks.end(), [&](const Block& block) {
        return offset > block.offset && offset - block.offset <= block.size;
    });
}

} // namespace Mz::platform
