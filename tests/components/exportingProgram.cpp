// SPDX-License-Identifier: BSL-1.0
/// A program that exports the entry point. It is not a component library.
#include "components/base/export.h"

extern "C" MZ_EXPORT void* QrGetComponentDescription() {
    return nullptr;
}

int main() {
    return QrGetComponentDescription() ? 1 : 0;
}
