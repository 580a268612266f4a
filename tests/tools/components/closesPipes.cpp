// SPDX-License-Identifier: BSL-1.0
/// Closes pipes that it did not open.
#include "tests/support/testSystem.h"
#include "tests/tools/components/enumerates.h"

MZ_TEST_ENUMERATES(Mz::Test::closePipes())
