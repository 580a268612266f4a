// SPDX-License-Identifier: BSL-1.0
/// What it returns is no description, and counted.
#include "tests/components/testUids.h"

extern "C" MZ_EXPORT Mz::QrCastable* QrGetComponentDescription() {
    return new Mz::Test::NamedObject("wrong");
}
