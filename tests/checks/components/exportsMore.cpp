// SPDX-License-Identifier: BSL-1.0
/// Exports a function besides its entry point.
#include "tests/checks/components/broken.h"

extern "C" MZ_EXPORT int mzTestHelper() {
    return 1;
}

MZ_BROKEN_DESCRIPTION(Mz::Test::PlainDescription)
