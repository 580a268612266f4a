// SPDX-License-Identifier: BSL-1.0
/// Uses more and more memory of the kind that processes share.
#include "tests/support/testSystem.h"
#include "tests/tools/components/enumerates.h"

static void eat() {
    // Bounded, should nothing stop it.
    for (int count = 0; count < 32; ++count)
        Mz::Test::useSharedMemory(std::uint64_t{64} << 20);
}

MZ_TEST_ENUMERATES(eat())
