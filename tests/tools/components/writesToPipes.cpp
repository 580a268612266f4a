// SPDX-License-Identifier: BSL-1.0
/// Writes to what it did not open the beginning of a message that never ends.
#include "tests/support/testSystem.h"
#include "tests/tools/components/enumerates.h"

MZ_TEST_ENUMERATES(Mz::Test::writeToPipes("MZPR\2\x7F\x7F\x7F\x7F"))
