// SPDX-License-Identifier: BSL-1.0
/// Writes 100 MiB to pipes that it did not open.
#include "tests/support/testSystem.h"
#include "tests/tools/components/enumerates.h"

MZ_TEST_ENUMERATES(Mz::Test::writeToPipes(std::string(std::size_t{100} << 20, 'x')))
