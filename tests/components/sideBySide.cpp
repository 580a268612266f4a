// SPDX-License-Identifier: BSL-1.0
/// Stands in the folder of a private assembly.
#include "components/base/export.h"

extern "C" MZ_EXPORT unsigned int sideBySideNumber() {
    return 1234;
}
