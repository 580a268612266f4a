// SPDX-License-Identifier: BSL-1.0
// Tests the numbers in mesh files: rounding, limits, invalid words, and independence of the locale.
#include "examples/mesh/reading/number.h"

#include <gtest/gtest.h>

#include <bit>
#include <charconv>
#include <clocale>
#include <cmath>
#include <random>
#include <string>

using namespace Meshes;

TEST(MeshNumbers, RoundToTheNearestFloat) {
    EXPECT_EQ(parseFloat("0.1"), 0.1F);
    EXPECT_EQ(parseFloat("16777217"), 16777216.0F);
    EXPECT_EQ(parseFloat("3.4028235e38"), 3.4028235e38F);
    EXPECT_EQ(parseFloat("1e-45"), 1e-45F);
    EXPECT_EQ(parseFloat("+0.5"), 0.5F);
    EXPECT_EQ(parseFloat("00001"), 1.0F);
}

TEST(MeshNumbers, ReadBackEveryFloat) {
    std::mt19937 random(5);
    for (int round = 0; round < 100000; ++round) {
        const auto number = std::bit_cast<float>(static_cast<std::uint32_t>(random()));
        if (!std::isfinite(number))
            continue;
        char text[64];
        const auto [end, error] = std::to_chars(text, text + sizeof text, number);
        ASSERT_EQ(parseFloat({text, static_cast<std::size_t>(end - text)}), number);
    }
}

TEST(MeshNumbers, AreZeroWhereTooSmall) {
    EXPECT_EQ(parseFloat("1e-60"), 0.0F);
    EXPECT_EQ(parseFloat("-1e-600"), 0.0F);
    EXPECT_EQ(parseFloat("1e-99999999999999999999"), 0.0F);
    EXPECT_EQ(parseFloat("0." + std::string(500, '0') + "1"), 0.0F);
    EXPECT_EQ(parseFloat("0e999"), 0.0F);
}

TEST(MeshNumbers, AreRefusedWhereTooLarge) {
    EXPECT_EQ(parseFloat("1e39"), std::nullopt);
    EXPECT_EQ(parseFloat("-1e999"), std::nullopt);
    EXPECT_EQ(parseFloat("1e99999999999999999999"), std::nullopt);
    EXPECT_EQ(parseFloat("1" + std::string(500, '0')), std::nullopt);
    EXPECT_EQ(parseUnsigned("4294967295"), 4294967295U);
    EXPECT_EQ(parseUnsigned("4294967296"), std::nullopt);
}

TEST(MeshNumbers, AreRefusedWhereTheyAreNone) {
    for (const char* word : {"", "+", "-", "+-1", "-+1", "++1", ".", "e5", "1e", "1x", "0x10",
                             "nan", "inf", "-inf", "1,5", " 1", "1 "})
        EXPECT_EQ(parseFloat(word), std::nullopt) << word;
    EXPECT_EQ(parseUnsigned("-1"), std::nullopt);
    EXPECT_EQ(parseUnsigned("+1"), std::nullopt);
    EXPECT_EQ(parseInteger("+12"), 12);
    EXPECT_EQ(parseInteger("-12"), -12);
    EXPECT_EQ(parseInteger("1.0"), std::nullopt);
}

TEST(MeshNumbers, MayBeInfiniteWhereTheyDoNotCount) {
    for (const char* word : {"nan", "-nan", "inf", "+1", "1e999", "-3"})
        EXPECT_TRUE(isNumber(word)) << word;
    EXPECT_FALSE(isNumber("up"));
    EXPECT_FALSE(isNumber(""));
}

TEST(MeshNumbers, DoNotFollowTheLocale) {
    for (const char* name : {"de_DE.UTF-8", "German_Germany", "de_DE", "fr_FR.UTF-8"})
        if (std::setlocale(LC_ALL, name))
            break;
    EXPECT_EQ(parseFloat("1.5"), 1.5F);
    EXPECT_EQ(parseFloat("1,5"), std::nullopt);
    std::setlocale(LC_ALL, "C");
}
