// SPDX-License-Identifier: BSL-1.0
// Tests the hash map by its documented behaviour and against std::unordered_map, and the hash of
// thread identifiers.
#include "components/componentManager/support/hashMap.h"
#include "components/componentManager/control/threadHash.h"
#include "tests/support/failingAllocations.h"

#include <gtest/gtest.h>

#include <cstdint>
#include <memory>
#include <random>
#include <unordered_map>
#include <vector>

using namespace Mz;
using Mz::Test::FailingAllocations;

namespace {

struct Same {
    std::uint32_t operator()(std::uint32_t key) const { return key; }
};
struct AllInOne {
    std::uint32_t operator()(std::uint32_t) const { return 4; }
};

using Map = HashMap<std::uint32_t, const char*, Same>;

TEST(HashMap, StartsWithEightBucketsAndDoublesBeforeItHoldsMoreEntries) {
    Map map;
    EXPECT_EQ(map.size(), 0u);
    for (std::uint32_t key = 0; key < 8; ++key)
        map[key] = "x";
    EXPECT_EQ(map.bucketCount(), 8u);
    map[8] = "x";
    EXPECT_EQ(map.bucketCount(), 16u);
    EXPECT_EQ(map.size(), 9u);
}

TEST(HashMap, FindsErasesAndClearsAlsoWhenItWasAlwaysEmpty) {
    Map map;
    EXPECT_EQ(map.find(1), nullptr);
    EXPECT_FALSE(map.erase(1));
    map.clear();
    map[1] = "one";
    EXPECT_STREQ(*map.find(1), "one");
    EXPECT_TRUE(map.erase(1));
    EXPECT_FALSE(map.erase(1));
    EXPECT_EQ(map.find(1), nullptr);
    EXPECT_EQ(map.size(), 0u);
    map[2] = "two";
    map.clear();
    EXPECT_EQ(map.find(2), nullptr);
    map[2] = "again";
    EXPECT_STREQ(*map.find(2), "again");
}

TEST(HashMap, MakesValuesThatWereMissing) {
    HashMap<std::uint32_t, int, Same> map;
    EXPECT_EQ(map[5], 0);
    map[5] = 7;
    EXPECT_EQ(map[5], 7);
    EXPECT_EQ(map.size(), 1u);
}

TEST(HashMap, KeepsTheAddressesOfValuesWhileItGrows) {
    Map map;
    const char** const first = &map[0];
    for (std::uint32_t key = 1; key < 1000; ++key)
        map[key] = "x";
    EXPECT_EQ(map.find(0), first);
}

TEST(HashMap, InsertsAKeyOnce) {
    Map map;
    const auto [place, isNew] = map.insert(3);
    EXPECT_TRUE(isNew);
    EXPECT_EQ(*place, nullptr);
    *place = "three";
    const auto [found, isNewAgain] = map.insert(3);
    EXPECT_FALSE(isNewAgain);
    EXPECT_EQ(found, place);
    EXPECT_EQ(map.size(), 1u);
}

TEST(HashMap, InsertsAsManyAsItReservedWithoutAnAllocation) {
    Map map;
    map.reserve(3);
    EXPECT_EQ(map.bucketCount(), 8u);
    map[1000] = "x";
    map.reserve(1000);
    EXPECT_EQ(map.bucketCount(), 1024u);
    EXPECT_STREQ(*map.find(1000), "x");
    const FailingAllocations failing(0);
    for (std::uint32_t key = 0; key < 999; ++key)
        map[key] = "y";
    EXPECT_FALSE(failing.failed());
    EXPECT_EQ(map.size(), 1000u);
    EXPECT_EQ(map.bucketCount(), 1024u);
}

TEST(HashMap, HoldsKeysOfOneHash) {
    HashMap<std::uint32_t, std::uint32_t, AllInOne> map;
    for (std::uint32_t key = 0; key < 100; ++key)
        map[key] = key * 2;
    for (std::uint32_t key = 0; key < 100; key += 3)
        EXPECT_TRUE(map.erase(key));
    for (std::uint32_t key = 0; key < 100; ++key) {
        const std::uint32_t* const found = map.find(key);
        ASSERT_EQ(found != nullptr, key % 3 != 0) << key;
        if (found) {
            EXPECT_EQ(*found, key * 2);
        }
    }
}

TEST(HashMap, DoesWhatTheStandardMapDoes) {
    HashMap<std::uint32_t, int, Same> map;
    std::unordered_map<std::uint32_t, int> expected;
    std::mt19937 random(20240611);
    for (int step = 0; step < 50000; ++step) {
        const auto key = static_cast<std::uint32_t>(random() % 300);
        switch (random() % 3) {
        case 0:
            map[key] = step;
            expected[key] = step;
            break;
        case 1: EXPECT_EQ(map.erase(key), expected.erase(key) == 1); break;
        default:
            const auto found = expected.find(key);
            ASSERT_EQ(map.find(key) != nullptr, found != expected.end());
            if (found != expected.end()) {
                ASSERT_EQ(*map.find(key), found->second);
            }
        }
        ASSERT_EQ(map.size(), expected.size());
        ASSERT_LE(map.size(), map.bucketCount());
    }
}

TEST(HashMap, DestroysWhatItHolds) {
    const auto shared = std::make_shared<int>(1);
    {
        HashMap<std::uint32_t, std::shared_ptr<int>, Same> map;
        for (std::uint32_t key = 0; key < 20; ++key)
            map[key] = shared;
        map.erase(3);
        EXPECT_EQ(shared.use_count(), 20);
    }
    EXPECT_EQ(shared.use_count(), 1);
}

TEST(ThreadHash, GivesTheExactValues) {
    constexpr ThreadHash hash;
    EXPECT_EQ(hash(0), 1624403320u);
    EXPECT_EQ(hash(0), 0x60D26D78u);
    EXPECT_EQ(hash(0) & 7, 0u);
    EXPECT_EQ(hash(1), 1624386513u);
    EXPECT_EQ(hash(1), 0x60D22BD1u);
    EXPECT_EQ(hash(1) & 7, 1u);
    EXPECT_EQ(hash(4660), 1546620524u);
    EXPECT_EQ(hash(4660), 0x5C2F8E6Cu);
    EXPECT_EQ(hash(4660) & 7, 4u);
}

TEST(ThreadHash, IsThePlainRemainderForEveryIdentifier) {
    constexpr ThreadHash hash;
    constexpr std::uint64_t modulus = 2147483647;
    std::mt19937 random(7);
    for (int step = 0; step < 100000; ++step) {
        const auto threadId = static_cast<std::uint32_t>(random());
        const std::uint64_t x = (threadId ^ 0xDEADBEEFu) & 0x7FFFFFFFu;
        ASSERT_EQ(hash(threadId) % modulus, x * 16807 % modulus) << threadId;
        ASSERT_LE(hash(threadId), 0x7FFFFFFFu);
    }
    for (const std::uint32_t x : {0u, 1u, 127773u, 2147483646u, 2147483647u})
        EXPECT_EQ(hash(x ^ 0xDEADBEEFu) % modulus, std::uint64_t{x} * 16807 % modulus) << x;
}

} // namespace
