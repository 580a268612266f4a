// SPDX-License-Identifier: BSL-1.0
// Crashes when its builders are enumerated.
#include "tests/tools/components/enumerates.h"
#include "tests/tools/components/faults.h"

MZ_TEST_ENUMERATES(Mz::Test::crash())
