// SPDX-License-Identifier: BSL-1.0
#include "components/componentManager/componentImp.h"

extern "C" MZ_EXPORT Mz::QrCastable* QrGetComponentDescription() {
    return nullptr;
}
