// SPDX-License-Identifier: BSL-1.0
/// Needs a function that the host's program exports.
#include "tests/tools/components/enumerates.h"
#include "tests/tools/recordedHost.h"

MZ_TEST_ENUMERATES(if (mzTestHostNumber() != 42) throw 1)
