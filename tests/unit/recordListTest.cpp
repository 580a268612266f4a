// SPDX-License-Identifier: BSL-1.0
// Tests the list of records and the pool of their memory.
#include "components/componentManager/manager/recordList.h"
#include "tests/support/failingAllocations.h"

#include <gtest/gtest.h>

#include <cstddef>
#include <memory>
#include <new>
#include <vector>

using namespace Mz;
using namespace Mz::Test;

namespace {

struct Record {
    int number = 0;
    std::shared_ptr<int> owned;
};

std::vector<int> numbersOf(const RecordList<Record>& list) {
    std::vector<int> numbers;
    for (std::size_t index = 0; index < list.size(); ++index)
        numbers.push_back(list[index].number);
    return numbers;
}

void fill(RecordList<Record>& list, int first, int last) {
    for (int number = first; number <= last; ++number)
        list.emplace_back({number, nullptr});
}

TEST(RecordList, KeepsOrderAndAddressesWhileItGrows) {
    NodePool<Record> pool;
    RecordList<Record> list(pool);
    EXPECT_TRUE(list.empty());
    std::vector<Record*> addresses;
    for (int number = 0; number < 1000; ++number) {
        addresses.push_back(&list.emplace_back());
        addresses.back()->number = number;
    }
    ASSERT_EQ(list.size(), 1000u);
    EXPECT_FALSE(list.empty());
    EXPECT_EQ(&list.front(), addresses[0]);
    for (std::size_t index = 0; index < addresses.size(); ++index) {
        ASSERT_EQ(&list[index], addresses[index]);
        ASSERT_EQ(list[index].number, static_cast<int>(index));
    }
}

TEST(RecordList, IsReversedWithoutMovingARecord) {
    NodePool<Record> pool;
    RecordList<Record> list(pool);
    list.reverse();
    fill(list, 1, 1);
    list.reverse();
    EXPECT_EQ(numbersOf(list), (std::vector{1}));
    fill(list, 2, 4);
    const Record* const last = &list[3];
    list.reverse();
    EXPECT_EQ(numbersOf(list), (std::vector{4, 3, 2, 1}));
    EXPECT_EQ(&list.front(), last);
}

TEST(RecordList, IsSwappedWithOneOfAnyLength) {
    for (int length = 0; length < 4; ++length)
        for (int other = 0; other < 4; ++other) {
            NodePool<Record> pool, otherPool;
            RecordList<Record> first(pool), second(otherPool);
            fill(first, 1, length);
            fill(second, 11, 10 + other);
            const std::vector<int> one = numbersOf(first), two = numbersOf(second);
            first.swap(second);
            EXPECT_EQ(numbersOf(first), two);
            EXPECT_EQ(numbersOf(second), one);
            fill(first, 5, 6);
            second.clear();
            EXPECT_EQ(first.size(), two.size() + 2);
        }
}

TEST(RecordList, ReturnsTheMemoryOfItsRecordsToTheirPool) {
    NodePool<Record> pool, otherPool;
    RecordList<Record> list(pool), other(otherPool);
    void* const memory = &list.emplace_back();
    void* const otherMemory = &other.emplace_back();
    list.swap(other);
    list.clear();
    EXPECT_EQ(otherPool.take(), otherMemory);
    other.clear();
    EXPECT_EQ(pool.take(), memory);
}

TEST(RecordList, DestroysItsRecordsAndCanBeFilledAgain) {
    const auto owned = std::make_shared<int>(1);
    NodePool<Record> pool;
    {
        RecordList<Record> list(pool);
        for (const int count : {1, 5, 2}) {
            for (int number = 0; number < count; ++number)
                list.emplace_back({number, owned});
            EXPECT_EQ(owned.use_count(), 1 + count);
            list.clear();
            EXPECT_TRUE(list.empty());
            EXPECT_EQ(owned.use_count(), 1);
        }
        list.emplace_back({0, owned});
    }
    EXPECT_EQ(owned.use_count(), 1);
}

TEST(RecordList, StaysAsItWasWithoutMemory) {
    const int failures = failEachAllocation([](Attempt& attempt) {
        NodePool<Record> pool;
        RecordList<Record> list(pool);
        EXPECT_TRUE(attempt.throwsOnFailure([&] { fill(list, 0, 99); }));
        const int complete = static_cast<int>(list.size());
        fill(list, complete, 99);
        for (int number = 0; number < 100; ++number)
            EXPECT_EQ(list[static_cast<std::size_t>(number)].number, number);
    });
    EXPECT_GE(failures, 8);
}

TEST(NodePool, GivesOutReturnedMemoryFirst) {
    NodePool<Record> pool;
    void* const first = pool.take();
    void* const second = pool.take();
    EXPECT_NE(first, second);
    pool.giveBack(first);
    pool.giveBack(second);
    EXPECT_EQ(pool.take(), second);
    EXPECT_EQ(pool.take(), first);
}

/// Takes what the pool gives without an allocation, and returns the number of nodes.
std::size_t takeAll(NodePool<Record>& pool) {
    const FailingAllocations failing(0);
    std::size_t count = 0;
    try {
        for (;; ++count)
            static_cast<void>(pool.take());
    } catch (const std::bad_alloc&) {
        return count;
    }
}

TEST(NodePool, ReservesOnceAndUsesWhatItHad) {
    NodePool<Record> plain, reserved;
    EXPECT_NE(plain.take(), reserved.take());
    reserved.reserve(1000);
    {
        const FailingAllocations failing(0);
        reserved.reserve(10);
        reserved.reserve(1000);
        EXPECT_FALSE(failing.failed());
    }
    const std::size_t others = takeAll(plain);
    EXPECT_GT(others, 0u);
    EXPECT_EQ(takeAll(reserved), 1000 + others);
}

} // namespace
