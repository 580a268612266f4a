// SPDX-License-Identifier: BSL-1.0
/// A minimal library with the entry point, which needs no other library.
#include "components/base/export.h"

extern "C" {
MZ_EXPORT int anotherFunction();
MZ_EXPORT void* QrGetComponentDescription();
MZ_EXPORT extern int someData;

int someData = 1;

int anotherFunction() {
    return someData;
}

void* QrGetComponentDescription() {
    return nullptr;
}
}
