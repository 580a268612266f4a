/// Counts of characters that stay at the largest `int` instead of overflowing.
///
/// A line, or what one format reads, may be longer than an `int` can count. Past that the exact
/// length tells nothing more: a line is long, and a count has no room.
#pragma once

#include <algorithm>
#include <cstdint>
#include <limits>

namespace Mz {

/// The sum of `count` and `more`, or the limit of `int` that it passes. `more` may be negative:
/// a foreign IO reports what it likes.
inline int addCharacters(int count, int more) {
    using Limits = std::numeric_limits<int>;
    const std::int64_t sum = std::int64_t{count} + more;
    return static_cast<int>(std::clamp<std::int64_t>(sum, Limits::min(), Limits::max()));
}

} // namespace Mz
