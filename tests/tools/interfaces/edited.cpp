// SPDX-License-Identifier: BSL-1.0
/// A library with the fingerprints of an edited interface. Only its file is read.
#include "tests/tools/interfaces/edited.h"

extern "C" MZ_EXPORT Mz::QrCastable* QrGetComponentDescription() {
    return nullptr;
}
