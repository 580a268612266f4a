// SPDX-License-Identifier: BSL-1.0
// Crashes in its entry point.
#include "components/componentManager/componentImp.h"
#include "tests/tools/components/faults.h"

extern "C" MZ_EXPORT Mz::QrCastable* QrGetComponentDescription() {
    Mz::Test::crash();
    return nullptr;
}
