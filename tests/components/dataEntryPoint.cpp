// SPDX-License-Identifier: BSL-1.0
/// Exports data under the name of the entry point.
#include "components/base/export.h"

extern "C" {
extern MZ_EXPORT int QrGetComponentDescription[4];
int QrGetComponentDescription[4] = {1, 2, 3, 4};

/// What counts the calls of functions does not link without one.
extern MZ_EXPORT int aFunction();
int aFunction() {
    return 0;
}
}
