// SPDX-License-Identifier: BSL-1.0
// Tests that random values, with fixed seeds, are read back as they were written.
#include "tests/streams/support.h"

#include <gtest/gtest.h>

#include <bit>
#include <cmath>
#include <cstring>
#include <random>
#include <vector>

namespace {

using namespace Mz::Test;
using Mz::int64;
using Mz::QrBinaryStream;
using Mz::QrTextStream;

/// The number of values of each type. The build chooses it, smaller where programs run slowly.
constexpr int count = MZ_RANDOM_VALUES / 4;

/// Returns values with random bit patterns.
template <class T>
std::vector<T> randomValues(unsigned int seed) {
    std::mt19937_64 engine(seed);
    std::vector<T> values(count);
    for (T& value : values) {
        const std::uint64_t bits = engine();
        std::memcpy(&value, &bits, sizeof value);
    }
    return values;
}

template <class T>
bool sameBits(const T& a, const T& b) {
    return std::memcmp(&a, &b, sizeof a) == 0;
}

/// Writes and reads every value alone, and all of them as one array.
template <class T>
void expectBinaryRoundTrip(unsigned int seed) {
    const std::vector<T> values = randomValues<T>(seed);
    const std::string bytes = written<QrBinaryStream>([&](Mz::QrStream& stream) {
        for (const T& value : values)
            stream << value;
    });
    EXPECT_EQ(bytes, written<QrBinaryStream>(
                         [&](Mz::QrStream& stream) { stream.write(values[0], count); }));
    Reading<QrBinaryStream> single(bytes);
    Reading<QrBinaryStream> counted(bytes);
    std::vector<T> array(values.size());
    EXPECT_EQ(counted.stream.read(array[0], count), count);
    int wrong = 0;
    for (std::size_t index = 0; index < values.size(); ++index) {
        T value{};
        single.stream >> value;
        wrong += sameBits(value, values[index]) && sameBits(array[index], values[index]) ? 0 : 1;
    }
    EXPECT_EQ(wrong, 0);
}

TEST(RoundTrip, EveryBitPatternComesBackFromBinaryData) {
    expectBinaryRoundTrip<int>(1);
    expectBinaryRoundTrip<int64>(2);
    expectBinaryRoundTrip<float>(3);
    expectBinaryRoundTrip<double>(4);
}

TEST(RoundTrip, IntegersComeBackFromText) {
    const std::vector<int> ints = randomValues<int>(5);
    const std::vector<int64> longs = randomValues<int64>(6);
    Reading<QrTextStream> in(written<QrTextStream>([&](Mz::QrStream& stream) {
        stream.write(ints[0], count);
        stream << 0;
        stream.write(longs[0], count);
    }));
    std::vector<int> readInts(ints.size());
    std::vector<int64> readLongs(longs.size());
    int zero = 1;
    ASSERT_EQ(in.stream.read(readInts[0], count), count);
    in.stream >> zero;
    EXPECT_EQ(in.stream.read(readLongs[0], count), count);
    EXPECT_TRUE(readInts == ints);
    EXPECT_TRUE(readLongs == longs);
}

TEST(RoundTrip, FiniteFloatsComeBackFromTextBitForBit) {
    std::vector<float> values = randomValues<float>(7);
    std::erase_if(values, [](float value) { return !std::isfinite(value); });
    const int size = static_cast<int>(values.size());
    Reading<QrTextStream> in(
        written<QrTextStream>([&](Mz::QrStream& stream) { stream.write(values[0], size); }));
    std::vector<float> read(values.size());
    ASSERT_EQ(in.stream.read(read[0], size), size);
    EXPECT_EQ(std::memcmp(read.data(), values.data(), values.size() * sizeof(float)), 0);
}

TEST(RoundTrip, FiniteDoublesComeBackFromTextToSixteenDigits) {
    std::vector<double> values = randomValues<double>(8);
    std::erase_if(values, [](double value) { return !std::isfinite(value); });
    const int size = static_cast<int>(values.size());
    const auto write = [&](const std::vector<double>& all) {
        return written<QrTextStream>([&](Mz::QrStream& stream) { stream.write(all[0], size); });
    };
    const std::string text = write(values);
    Reading<QrTextStream> in(text);
    std::vector<double> read(values.size());
    ASSERT_EQ(in.stream.read(read[0], size), size);
    int wrong = 0;
    for (std::size_t index = 0; index < values.size(); ++index)
        wrong += std::fabs(read[index] - values[index]) <= 1e-15 * std::fabs(values[index]) ? 0 : 1;
    EXPECT_EQ(wrong, 0);
    EXPECT_TRUE(write(read) == text);
}

TEST(RoundTrip, NotANumberKeepsItsBitsInBinaryData) {
    for (const std::uint64_t bits :
         {0x7FF0000000000001ULL, 0xFFF8000000000123ULL, 0x7FF8000000000000ULL}) {
        const auto value = std::bit_cast<double>(bits);
        double read[1] = {0};
        Reading<QrBinaryStream> in(
            written<QrBinaryStream>([&](Mz::QrStream& stream) { stream.write(value, 1); }));
        EXPECT_EQ(in.stream.read(read[0], 1), 1);
        EXPECT_TRUE(sameBits(read[0], value));
    }
    const auto signalling = std::bit_cast<float>(0x7F800001U);
    EXPECT_EQ(
        toHex(written<QrBinaryStream>([&](Mz::QrStream& stream) { stream.write(signalling, 1); })),
        "7F 80 00 01");
}

/// The FNV-1a hash.
std::uint64_t hashOf(const std::string& text) {
    std::uint64_t hash = 0xCBF29CE484222325ULL;
    for (const char c : text)
        hash = (hash ^ static_cast<unsigned char>(c)) * 0x100000001B3ULL;
    return hash;
}

TEST(RoundTrip, ACorpusOfTextIsTheSameOnEveryPlatform) {
    // The number of values is fixed, so that the text is the same in every build.
    std::mt19937_64 engine(9);
    const std::string text = written<QrTextStream>([&](Mz::QrStream& stream) {
        for (int round = 0; round < 5000; ++round) {
            const std::uint64_t bits = engine();
            stream << static_cast<int>(bits) << static_cast<int64>(bits) << static_cast<char>(bits)
                   << static_cast<unsigned short>(bits) << static_cast<unsigned long long>(bits)
                   << static_cast<wchar_t>(bits & 0xFFFF)
                   << static_cast<long>(static_cast<int>(bits))
                   << std::bit_cast<float>(static_cast<std::uint32_t>(bits))
                   << std::bit_cast<double>(bits) << static_cast<double>(bits) / 1e6
                   << (bits % 2 == 0) << std::wstring(bits % 7, L'x');
            stream.formattedWrite(L"%12.4e|%-20.3f|%#x|%+08d|%a", static_cast<double>(bits) * 1e-12,
                                  static_cast<double>(bits) * 1e-12,
                                  static_cast<unsigned int>(bits), static_cast<int>(bits),
                                  std::bit_cast<double>(bits));
        }
    });
    EXPECT_EQ(text.size(), 1092072U);
    EXPECT_EQ(hashOf(text), 11447853732097713141U);
}

} // namespace
