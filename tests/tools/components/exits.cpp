// SPDX-License-Identifier: BSL-1.0
// Calls std::exit when its builders are enumerated.
#include "tests/tools/components/enumerates.h"

#include <cstdlib>

MZ_TEST_ENUMERATES(std::exit(0))
