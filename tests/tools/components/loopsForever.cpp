// SPDX-License-Identifier: BSL-1.0
// Never returns when its builders are enumerated.
#include "tests/tools/components/enumerates.h"

static volatile bool forever = true;

MZ_TEST_ENUMERATES(while (forever){})
