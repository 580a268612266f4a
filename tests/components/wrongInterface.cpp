// SPDX-License-Identifier: BSL-1.0
/// Returns a counted object that is not a description.
#include "tests/components/testUids.h"

extern "C" MZ_EXPORT Mz::QrCastable* QrGetComponentDescription() {
    return new Mz::Test::NamedObject("wrong");
}
