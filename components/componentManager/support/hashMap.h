// SPDX-License-Identifier: BSL-1.0
/// The hash map of the registries. Private to this library.
///
/// Unlike `std::unordered_map`, it is constant-initialised, so that registries work while other
/// static objects are constructed. A lookup needs no division: the size of the table is a power of
/// two, and the bucket is the masked hash. Nodes never move. They are allocated in blocks, and a
/// map whose final size is known needs one block.
#pragma once

#include "components/componentManager/support/nodePool.h"

#include <algorithm>
#include <bit>
#include <cstddef>
#include <new>
#include <utility>

namespace Mz {

/// A map from `Key` (compared with `==`) to `Value`. `Hash()(key)` returns an unsigned integer.
///
/// The table starts with 8 buckets, and doubles before it holds more entries than buckets. The
/// address of a value is valid until its entry is erased. Not thread-safe.
template <class Key, class Value, class Hash>
class HashMap {
  public:
    constexpr HashMap() noexcept = default;
    HashMap(const HashMap&) = delete;
    HashMap& operator=(const HashMap&) = delete;
    ~HashMap() { clear(); }

    /// Returns the value of `key`, or null if there is no entry.
    Value* find(const Key& key) noexcept {
        Node* node = entries ? *slotOf(key) : nullptr;
        return node ? &node->value : nullptr;
    }
    const Value* find(const Key& key) const noexcept {
        return const_cast<HashMap*>(this)->find(key);
    }

    /// Returns the value of `key`. Inserts `Value()` if there is no entry.
    ///
    /// \throws std::bad_alloc  if memory runs out; nothing is inserted
    Value& operator[](const Key& key) { return *insert(key).first; }

    /// Does the same. Returns the address of the value, and whether it was inserted.
    std::pair<Value*, bool> insert(const Key& key) {
        if (buckets == 0)
            rehash(smallestTable);
        Node** slot = slotOf(key);
        if (*slot)
            return {&(*slot)->value, false};
        if (entries == buckets) {
            rehash(buckets * 2);
            slot = slotOf(key);
        }
        *slot = new (pool.take()) Node{nullptr, key, Value()};
        ++entries;
        return {&(*slot)->value, true};
    }

    /// Allocates what `count` entries need, so that inserting them allocates nothing.
    ///
    /// \throws std::bad_alloc  if memory runs out; the entries have not changed
    void reserve(std::size_t count) {
        if (count > entries)
            pool.reserve(count - entries);
        if (count > buckets)
            rehash(std::max(std::bit_ceil(count), smallestTable));
    }

    /// Erases the entry of `key`. Returns whether there was one.
    bool erase(const Key& key) noexcept {
        Node** slot = entries ? slotOf(key) : nullptr;
        if (!slot || !*slot)
            return false;
        Node* node = *slot;
        *slot = node->next;
        --entries;
        destroy(node);
        return true;
    }

    /// Erases all entries and frees all memory.
    void clear() noexcept {
        for (std::size_t bucket = 0; bucket < buckets; ++bucket)
            while (Node* node = table[bucket]) {
                table[bucket] = node->next;
                destroy(node);
            }
        pool.freeAll();
        delete[] table;
        table = nullptr;
        buckets = entries = 0;
    }

    std::size_t size() const noexcept { return entries; }
    std::size_t bucketCount() const noexcept { return buckets; }

  private:
    struct Node {
        Node* next;
        Key key;
        Value value;
    };

    static constexpr std::size_t smallestTable = 8;

    void destroy(Node* node) noexcept {
        node->~Node();
        pool.giveBack(node);
    }

    Node** bucketOf(const Key& key) const noexcept {
        return &table[static_cast<std::size_t>(Hash()(key)) & (buckets - 1)];
    }

    /// Returns the link to the node of `key`, or the null link at the end of its bucket. The table
    /// must exist.
    Node** slotOf(const Key& key) const noexcept {
        Node** slot = bucketOf(key);
        while (*slot && !((*slot)->key == key))
            slot = &(*slot)->next;
        return slot;
    }

    void rehash(std::size_t newBuckets) {
        const std::size_t oldBuckets = buckets;
        Node** oldTable = table;
        table = new Node*[newBuckets]();
        buckets = newBuckets;
        for (std::size_t bucket = 0; bucket < oldBuckets; ++bucket)
            while (Node* node = oldTable[bucket]) {
                oldTable[bucket] = node->next;
                Node** slot = bucketOf(node->key);
                node->next = *slot;
                *slot = node;
            }
        delete[] oldTable;
    }

    Node** table = nullptr;
    std::size_t buckets = 0;
    std::size_t entries = 0;
    NodePool<Node> pool;
};

} // namespace Mz
