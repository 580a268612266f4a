// SPDX-License-Identifier: BSL-1.0
/// Enumerates builders without an end.
#include "tests/tools/components/enumerates.h"

static volatile bool forever = true;

MZ_TEST_ENUMERATES(while (forever) PlainDescription::enumerateBuilders(e))
