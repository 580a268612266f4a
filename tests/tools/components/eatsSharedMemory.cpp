// SPDX-License-Identifier: BSL-1.0
/// Allocates more and more shared memory.
#include "tests/support/testSystem.h"
#include "tests/tools/components/enumerates.h"

static void eat() {
    // Limited to 2 GiB in case that nothing stops it.
    for (int count = 0; count < 32; ++count)
        Mz::Test::useSharedMemory(std::uint64_t{64} << 20);
}

MZ_TEST_ENUMERATES(eat())
