/// How thread identifiers spread over a table.
#pragma once

#include <cstdint>

namespace Mz {

/// One step of the minimal standard generator of Park and Miller, by Schrage's method, which needs
/// no more than 32 bits: identifiers that systems hand out in steps spread over all buckets.
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
