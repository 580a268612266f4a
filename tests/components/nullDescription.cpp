// SPDX-License-Identifier: BSL-1.0
// Returns null from its entry point.
#include "components/componentManager/componentImp.h"

extern "C" MZ_EXPORT Mz::QrCastable* QrGetComponentDescription() {
    return nullptr;
}
