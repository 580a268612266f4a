// SPDX-License-Identifier: BSL-1.0
/// The hash function of thread identifiers.
#pragma once

#include <cstdint>

namespace Mz {

/// Hashes a thread identifier by one step of the Park-Miller minimal standard generator.
///
/// Systems assign identifiers in regular steps; the generator spreads them over all buckets.
/// Schrage's method keeps the arithmetic within 32 bits.
struct ThreadHash {
    constexpr std::uint32_t operator()(std::uint32_t threadId) const {
        const auto x = static_cast<std::int32_t>((threadId ^ 0xDEADBEEFu) & 0x7FFFFFFFu);
        const std::int32_t high = x / 127773;
        const std::int32_t low = x % 127773;
        const std::int32_t next = 16807 * low - 2836 * high;
        return static_cast<std::uint32_t>(next < 0 ? next + 2147483647 : next);
    }
};

} // namespace Mz
