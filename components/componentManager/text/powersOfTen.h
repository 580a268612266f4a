// SPDX-License-Identifier: BSL-1.0
/// Powers of ten of 128 bits, by which numbers are converted between binary and decimal form. The
/// compiler computes the table.
#pragma once

#include <array>
#include <cstddef>
#include <cstdint>

namespace Mz {

__extension__ using UInt128 = unsigned __int128;

/// A power of ten: (`high` * 2^64 + `low`) * 2^(`exponent` - 127). The highest bit is set. Too
/// small by less than one unit of `low`.
struct PowerOfTen {
    std::uint64_t high = 0;
    std::uint64_t low = 0;
    int exponent = 0; ///< the power of two, rounded down
};

inline constexpr int smallestPowerOfTen = -330;
inline constexpr int largestPowerOfTen = 330;

namespace detail {

/// A number of 192 bits, the lowest word first. The 64 bits more than the table keeps hold the
/// errors of hundreds of steps.
struct WidePower {
    std::uint64_t words[3] = {0, 0, std::uint64_t{1} << 63};
    int exponent = 0;

    constexpr PowerOfTen rounded() const { return {words[2], words[1], exponent}; }

    /// Multiplies by ten: by 5/4 or 5/8, whichever keeps the highest bit, and the power of two.
    constexpr void multiplyByTen() {
        UInt128 carry = 0;
        for (std::uint64_t& word : words) {
            carry += static_cast<UInt128>(word) * 5;
            word = static_cast<std::uint64_t>(carry);
            carry >>= 64;
        }
        const int shift = carry >= 4 ? 3 : 2;
        for (int index = 0; index < 3; ++index) {
            const std::uint64_t next =
                index < 2 ? words[index + 1] : static_cast<std::uint64_t>(carry);
            words[index] = words[index] >> shift | next << (64 - shift);
        }
        exponent += shift + 1;
    }

    /// Divides by ten: by five, after a shift by 2 or 3 bits that keeps the highest bit.
    constexpr void divideByTen() {
        const int shift = words[2] / 5 >= std::uint64_t{1} << 61 ? 2 : 3;
        UInt128 rest = words[2] >> (64 - shift);
        for (int index = 2; index >= 0; --index) {
            const std::uint64_t below = index > 0 ? words[index - 1] >> (64 - shift) : 0;
            rest = rest << 64 | (words[index] << shift | below);
            words[index] = static_cast<std::uint64_t>(rest / 5);
            rest %= 5;
        }
        exponent -= shift + 1;
    }
};

inline constexpr auto powersOfTen = [] {
    std::array<PowerOfTen, largestPowerOfTen - smallestPowerOfTen + 1> powers{};
    WidePower up;
    for (int power = 0; power <= largestPowerOfTen; ++power, up.multiplyByTen())
        powers[static_cast<std::size_t>(power - smallestPowerOfTen)] = up.rounded();
    WidePower down;
    for (int power = -1; power >= smallestPowerOfTen; --power) {
        down.divideByTen();
        powers[static_cast<std::size_t>(power - smallestPowerOfTen)] = down.rounded();
    }
    return powers;
}();

} // namespace detail

inline const PowerOfTen& powerOfTen(int power) {
    return detail::powersOfTen[static_cast<std::size_t>(power - smallestPowerOfTen)];
}

/// Returns the upper 128 bits of the product, with the binary point 127 - `exponent` bits from the
/// right if the mantissa is an integer of 64 bits divided by 2^64.
inline UInt128 multiplied(std::uint64_t mantissa, const PowerOfTen& factor) {
    return static_cast<UInt128>(mantissa) * factor.high +
           (static_cast<UInt128>(mantissa) * factor.low >> 64);
}

/// A product of `multiplied` is too small by less than this, with a large margin: by one unit for
/// the power and one for the bits that it drops.
inline constexpr unsigned int productError = 64;

} // namespace Mz
