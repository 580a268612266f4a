// SPDX-License-Identifier: BSL-1.0
/// The library that `missesDependency` cannot find.
#include "components/base/export.h"

extern "C" MZ_EXPORT int absentFunction() {
    return 1;
}
