// SPDX-License-Identifier: BSL-1.0
/// The dependency of `missesDependency`. The build puts it where the loader does not find it.
#include "components/base/export.h"

extern "C" MZ_EXPORT int absentFunction() {
    return 1;
}
