// SPDX-License-Identifier: BSL-1.0
/// Has no description, and throws while it is unloaded for that.
#include "tests/components/testUids.h"

#include <stdexcept>

__attribute__((destructor)) static void finalise() {
    throw std::runtime_error("in a finaliser");
}

extern "C" MZ_EXPORT Mz::QrCastable* QrGetComponentDescription() {
    return nullptr;
}
