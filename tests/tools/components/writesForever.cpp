// SPDX-License-Identifier: BSL-1.0
/// Writes to what it did not open more than anybody wants to read.
#include "tests/support/testSystem.h"
#include "tests/tools/components/enumerates.h"

MZ_TEST_ENUMERATES(Mz::Test::writeToPipes(std::string(std::size_t{100} << 20, 'x')))
