// SPDX-License-Identifier: BSL-1.0
/// Throws std::bad_alloc although it uses little memory.
#include "tests/tools/components/enumerates.h"

#include <new>

MZ_TEST_ENUMERATES(throw std::bad_alloc())
