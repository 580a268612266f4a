// SPDX-License-Identifier: BSL-1.0
/// Says that there is no memory, though it takes hardly any.
#include "tests/tools/components/enumerates.h"

#include <new>

MZ_TEST_ENUMERATES(throw std::bad_alloc())
