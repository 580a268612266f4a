// SPDX-License-Identifier: BSL-1.0
/// The smallest growth of the rounds counts: a list that doubles its memory whenever it is full has
/// a round without growth among them. A single block for each call is enough, because no
/// block of the heap is smaller than eight bytes.
#include "components/componentTools/checking/growth.h"

#include "components/componentTools/platform/resources.h"

#include <algorithm>
#include <limits>

namespace Mz::Tools {

std::size_t growthOf(const std::function<void()>& action, int count) {
    constexpr int rounds = 6;
    constexpr std::size_t smallestBlock = 8;
    for (int call = 0; call < count / 4; ++call)
        action();
    std::size_t smallest = std::numeric_limits<std::size_t>::max();
    for (int round = 0; round < rounds && smallest > 0; ++round) {
        const std::size_t before = System::heapInUse();
        for (int call = 0; call < count; ++call)
            action();
        const std::size_t after = System::heapInUse();
        smallest = std::min(smallest, after > before ? after - before : 0);
    }
    const std::size_t each = smallest / static_cast<std::size_t>(count);
    return each >= smallestBlock ? each : 0;
}

} // namespace Mz::Tools
