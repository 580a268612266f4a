// SPDX-License-Identifier: BSL-1.0
#include "tests/tools/components/enumerates.h"

#include <cstdlib>

MZ_TEST_ENUMERATES(std::abort())
