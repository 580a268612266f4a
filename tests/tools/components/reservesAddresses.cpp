// SPDX-License-Identifier: BSL-1.0
/// Reserves much more address space than the memory limit, as code generators do, and works.
#include "tests/support/testSystem.h"
#include "tests/tools/components/enumerates.h"

#include <cstdlib>

static void reserve() {
    constexpr std::uint64_t much = std::uint64_t{8} << 30;
    if (!Mz::Test::reserveAddresses(much, false))
        std::abort();
}

MZ_TEST_ENUMERATES(reserve())
