// SPDX-License-Identifier: BSL-1.0
/// A second source of a component library. Only one of its sources exports the stamp.
#include "components/componentKit/componentKit.h"

int mzTestSecondSource() {
    return 42;
}
