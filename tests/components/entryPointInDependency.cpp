// SPDX-License-Identifier: BSL-1.0
/// Does not export the entry point, but needs a library that does.
#include "components/base/export.h"

extern "C" MZ_IMPORT int dependencyIsNeeded();

extern "C" MZ_EXPORT int needsDependency() {
    return dependencyIsNeeded();
}
