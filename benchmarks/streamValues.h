// SPDX-License-Identifier: BSL-1.0
/// The values that the benchmarks of streams write and read.
#pragma once

#include <cstddef>
#include <cstdint>
#include <cstring>
#include <random>
#include <type_traits>
#include <vector>

namespace Mz::Benchmarks {

/// The number of single binary values: large enough to make fixed costs negligible, small enough
/// for the cache.
inline constexpr int valueCount = 20'000;

/// The number of values in an array: larger than a small cache, as the arrays of a mesh are.
inline constexpr int arrayCount = 1'000'000;

/// The number of values in text. The branches depend on the digits, and a processor would learn
/// those of 20,000 repeated values.
inline constexpr int textCount = 1'000'000;

/// Returns `int`s of the whole range, or `double`s between -1000 and 1000.
template <class T>
std::vector<T> randomValues(int count) {
    std::mt19937_64 random(20'001);
    std::uniform_real_distribution<double> real(-1000, 1000);
    std::vector<T> values(static_cast<std::size_t>(count));
    for (T& value : values) {
        if constexpr (std::is_floating_point_v<T>)
            value = real(random);
        else
            value = static_cast<T>(random());
    }
    return values;
}

inline std::uint32_t swapped(int value) {
    return __builtin_bswap32(static_cast<std::uint32_t>(value));
}

inline std::uint64_t swapped(double value) {
    std::uint64_t bits;
    std::memcpy(&bits, &value, sizeof bits);
    return __builtin_bswap64(bits);
}

template <class T>
void unswap(T& value) {
    const auto bits = swapped(value);
    std::memcpy(&value, &bits, sizeof value);
}

} // namespace Mz::Benchmarks
