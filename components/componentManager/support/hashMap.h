// SPDX-License-Identifier: BSL-1.0
/// The hash map of the registries. Private to this library.
///
/// Unlike `std::unordered_map`, it is constant-initialised, so that registries work while other
/// static objects are constructed. A lookup needs no division: the size of the table is a power of
/// two, and the bucket is the masked hash. Nodes never move.
#pragma once

#include <cstddef>
#include <memory>
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
    Value& operator[](const Key& key) {
        if (Value* found = find(key))
            return *found;
        auto node = std::unique_ptr<Node>(new Node{nullptr, key, Value()});
        if (entries == buckets)
            grow();
        Node** slot = slotOf(key);
        *slot = node.release();
        ++entries;
        return (*slot)->value;
    }

    /// Erases the entry of `key`. Returns whether there was one.
    bool erase(const Key& key) noexcept {
        Node** slot = entries ? slotOf(key) : nullptr;
        if (!slot || !*slot)
            return false;
        Node* node = *slot;
        *slot = node->next;
        --entries;
        delete node;
        return true;
    }

    /// Erases all entries and frees the table.
    void clear() noexcept {
        for (std::size_t bucket = 0; bucket < buckets; ++bucket)
            while (Node* node = table[bucket]) {
                table[bucket] = node->next;
                delete node;
            }
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

    void grow() {
        const std::size_t oldBuckets = buckets;
        Node** oldTable = table;
        const std::size_t newBuckets = oldBuckets ? oldBuckets * 2 : 8;
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
};

} // namespace Mz
