// SPDX-License-Identifier: BSL-1.0
/// A library in the plug-ins folder whose author forgot MZ_COMPONENT.
#include "components/componentManager/export.h"

extern "C" MZ_EXPORT int answer() {
    return 42;
}
