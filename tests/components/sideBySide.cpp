// SPDX-License-Identifier: BSL-1.0
/// A library in the folder of a private assembly.
#include "components/base/export.h"

extern "C" MZ_EXPORT unsigned int sideBySideNumber() {
    return 1234;
}
