// SPDX-License-Identifier: BSL-1.0
/// What it exports under the entry point's name is no function.
#include "components/base/export.h"

extern "C" {
extern MZ_EXPORT int QrGetComponentDescription[4];
int QrGetComponentDescription[4] = {1, 2, 3, 4};
}
