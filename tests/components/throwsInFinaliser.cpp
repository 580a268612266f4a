// SPDX-License-Identifier: BSL-1.0
/// Returns no description, and throws when it is unloaded.
#include "tests/components/testUids.h"

#include <stdexcept>

__attribute__((destructor)) static void finalise() {
    throw std::runtime_error("in a finaliser");
}

extern "C" MZ_EXPORT Mz::QrCastable* QrGetComponentDescription() {
    return nullptr;
}
