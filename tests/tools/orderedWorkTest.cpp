// SPDX-License-Identifier: BSL-1.0
/// Exceptions of parts that other threads do: the caller gets each one where it waits for its part.
#include "components/componentTools/scanning/orderedWork.h"

#include <gtest/gtest.h>

#include <array>
#include <cstddef>
#include <stdexcept>

using namespace Mz::Tools;

namespace {

TEST(OrderedWork, ThrowsWhatAPartThrewWhereItIsWaitedFor) {
    for (const std::size_t threads : {1U, 2U}) {
        std::array<int, 4> calls{};
        OrderedWork all(calls.size(), threads, [&](std::size_t index, const OrderedWork&) {
            ++calls[index];
            if (index == 1)
                throw std::out_of_range("second");
        });
        EXPECT_EQ(all.hasThreads(), threads == 2);
        for (std::size_t index = 0; index < calls.size(); ++index)
            if (index == 1)
                EXPECT_THROW(all.wait(index, [] {}), std::out_of_range);
            else
                EXPECT_NO_THROW(all.wait(index, [] {}));
        EXPECT_EQ(calls, (std::array{1, 1, 1, 1}));
    }
}

} // namespace
