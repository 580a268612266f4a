// SPDX-License-Identifier: BSL-1.0
/// The builder records of one library.
///
/// Clients and the index hold pointers to the records, so a record never moves. All records of a
/// manager come from its pool, which allocates many at once. The list is an array of pointers; the
/// usual list, of one builder, needs no array.
#pragma once

#include "components/componentManager/support/nodePool.h"

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <utility>

namespace Mz {

/// Owns objects of class `Record`. Growing does not move them in memory.
template <class Record>
class RecordList {
  public:
    /// `pool` must outlive the list.
    explicit RecordList(NodePool<Record>& pool) noexcept : pool(&pool) {}
    RecordList(const RecordList&) = delete;
    RecordList& operator=(const RecordList&) = delete;
    ~RecordList() { clear(); }

    bool empty() const noexcept { return count == 0; }
    std::size_t size() const noexcept { return count; }
    Record& operator[](std::size_t index) noexcept { return *begin()[index]; }
    const Record& operator[](std::size_t index) const noexcept {
        return *const_cast<RecordList*>(this)->begin()[index];
    }
    Record& front() noexcept { return (*this)[0]; }
    const Record& front() const noexcept { return (*this)[0]; }

    /// Appends a copy of `record`, and returns it.
    ///
    /// \throws std::bad_alloc  if memory runs out; the list has not changed
    Record& emplace_back(const Record& record = Record()) {
        if (count == capacity)
            grow();
        Record* const added = new (pool->take()) Record(record);
        begin()[count++] = added;
        return *added;
    }

    void reverse() noexcept { std::reverse(begin(), begin() + count); }

    void clear() noexcept {
        while (count > 0) {
            Record* const last = begin()[--count];
            last->~Record();
            pool->giveBack(last);
        }
        if (capacity > 1)
            delete[] records.array;
        capacity = 1;
    }

    void swap(RecordList& other) noexcept {
        std::swap(pool, other.pool);
        std::swap(records, other.records);
        std::swap(count, other.count);
        std::swap(capacity, other.capacity);
    }

  private:
    Record** begin() noexcept { return capacity > 1 ? records.array : &records.single; }

    void grow() {
        const std::uint32_t doubled = capacity * 2;
        auto** const larger = new Record*[doubled];
        std::copy_n(begin(), count, larger);
        if (capacity > 1)
            delete[] records.array;
        records.array = larger;
        capacity = doubled;
    }

    union Records {
        Record* single = nullptr;
        Record** array; ///< if `capacity` is more than 1
    };

    NodePool<Record>* pool;
    Records records;
    std::uint32_t count = 0;
    std::uint32_t capacity = 1;
};

} // namespace Mz
