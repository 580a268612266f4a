// SPDX-License-Identifier: BSL-1.0
/// The smallest library with the entry point; it needs no other library.
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
