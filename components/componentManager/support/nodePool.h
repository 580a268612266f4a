// SPDX-License-Identifier: BSL-1.0
/// Memory for the nodes of one container. Private to this library.
///
/// Nodes are allocated in blocks, which saves an allocation and its overhead for each node. A block
/// is freed with all others only: a container of this library shrinks rarely and grows again.
#pragma once

#include <algorithm>
#include <cstddef>
#include <new>

namespace Mz {

/// Hands out memory for objects of class `Node`, which the container constructs and destroys.
/// Constant-initialised. Not thread-safe.
template <class Node>
class NodePool {
  public:
    constexpr NodePool() noexcept = default;
    NodePool(const NodePool&) = delete;
    NodePool& operator=(const NodePool&) = delete;
    ~NodePool() { freeAll(); }

    /// Returns memory for a node.
    ///
    /// \throws std::bad_alloc  if memory runs out
    void* take() {
        if (returned) {
            void* const memory = returned;
            returned = returned->next;
            return memory;
        }
        if (unusedBegin == unusedEnd)
            addBlock(std::clamp(capacity, smallestBlock, largestBlock));
        void* const memory = unusedBegin;
        unusedBegin += sizeof(Node);
        return memory;
    }

    /// Takes back the memory of a destroyed node.
    void giveBack(void* memory) noexcept { returned = new (memory) Link{returned}; }

    /// Allocates what another `count` nodes need, in one block.
    ///
    /// \throws std::bad_alloc  if memory runs out; nothing has changed
    void reserve(std::size_t count) {
        const auto unused = static_cast<std::size_t>(unusedEnd - unusedBegin) / sizeof(Node);
        if (unused >= count)
            return;
        std::byte* begin = unusedBegin;
        std::byte* const end = unusedEnd;
        addBlock(count);
        for (; begin != end; begin += sizeof(Node))
            giveBack(begin);
    }

    /// Frees all memory. All nodes must be destroyed.
    void freeAll() noexcept {
        while (Link* const block = blocks) {
            blocks = block->next;
            ::operator delete(block);
        }
        returned = nullptr;
        unusedBegin = unusedEnd = nullptr;
        capacity = 0;
    }

  private:
    struct Link {
        Link* next;
    };
    static constexpr std::size_t smallestBlock = 8;
    static constexpr std::size_t largestBlock = 128;

    /// Replaces the unused memory by that of a new block.
    void addBlock(std::size_t count) {
        static_assert(sizeof(Node) >= sizeof(Link) && alignof(Node) == alignof(Link));
        void* const memory = ::operator new(sizeof(Link) + count * sizeof(Node));
        blocks = new (memory) Link{blocks};
        unusedBegin = static_cast<std::byte*>(memory) + sizeof(Link);
        unusedEnd = unusedBegin + count * sizeof(Node);
        capacity += count;
    }

    Link* blocks = nullptr;
    Link* returned = nullptr; ///< the memory of destroyed nodes
    std::byte* unusedBegin = nullptr;
    std::byte* unusedEnd = nullptr;
    std::size_t capacity = 0; ///< in nodes
};

} // namespace Mz
