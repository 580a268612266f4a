// SPDX-License-Identifier: BSL-1.0
/// A component that crashes while it is loaded, before it can describe anything: for the
/// demonstration of what a scan does with it. No host of the mesh components searches its folder.
#include "components/componentKit/componentKit.h"

namespace {

/// Null, which the compiler must not know.
int* volatile nowhere = nullptr;
const bool crashed = (*nowhere = 1) == 1;

} // namespace

MZ_COMPONENT(L"Crashing", L"Never described")
