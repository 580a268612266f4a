// SPDX-License-Identifier: BSL-1.0
/// Writes the beginning of an incomplete message to pipes that it did not open.
#include "tests/support/testSystem.h"
#include "tests/tools/components/enumerates.h"

MZ_TEST_ENUMERATES(Mz::Test::writeToPipes("MZPR\2\x7F\x7F\x7F\x7F"))
