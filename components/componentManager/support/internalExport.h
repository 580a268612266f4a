// SPDX-License-Identifier: BSL-1.0
/// The export macro of internal names that only the tests use.
///
/// The shipped library hides these names. The tests link a second library, built from the same
/// sources with `MZ_EXPORTING_INTERNALS`. They define `MZ_IMPORTING_INTERNALS`.
#pragma once

#include "components/base/export.h"

#if defined(MZ_EXPORTING_INTERNALS)
#define MZ_INTERNAL_API MZ_EXPORT
#elif defined(MZ_IMPORTING_INTERNALS)
#define MZ_INTERNAL_API MZ_IMPORT
#else
#define MZ_INTERNAL_API
#endif
