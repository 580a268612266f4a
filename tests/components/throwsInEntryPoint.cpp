// SPDX-License-Identifier: BSL-1.0
// Throws in its entry point.
#include "components/componentManager/componentImp.h"

extern "C" MZ_EXPORT Mz::QrCastable* QrGetComponentDescription() {
    throw 42;
}
