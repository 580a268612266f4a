// SPDX-License-Identifier: BSL-1.0
/// Tells the loader that it cannot be initialised.
#include "tests/checks/components/broken.h"

#include <windows.h>

extern "C" BOOL WINAPI DllMain(HINSTANCE, DWORD reason, LPVOID) {
    return reason != DLL_PROCESS_ATTACH;
}

MZ_BROKEN_OBJECT(Mz::Test::Stored)
