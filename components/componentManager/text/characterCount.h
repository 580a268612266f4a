// SPDX-License-Identifier: BSL-1.0
/// Saturating counts of characters, which stop at the largest `int` and do not overflow.
///
/// A line, or the text of one format, may have more characters than an `int` can count. The exact
/// number does not matter then: the line is long, and `%n` has no room for it.
#pragma once

#include <algorithm>
#include <cstdint>
#include <limits>

namespace Mz {

/// Returns the sum of `count` and `more`, or the limit of `int` that it exceeds. `more` may be
/// negative: a foreign IO may return any number.
inline int addCharacters(int count, int more) {
    using Limits = std::numeric_limits<int>;
    const std::int64_t sum = std::int64_t{count} + more;
    return static_cast<int>(std::clamp<std::int64_t>(sum, Limits::min(), Limits::max()));
}

} // namespace Mz
