// SPDX-License-Identifier: BSL-1.0
#include "tests/checks/components/system.h"

#include <windows.h>

namespace Mz::Test {

bool holdThisLibrary() {
    HMODULE module = nullptr;
    return ::GetModuleHandleExW(GET_MODULE_HANDLE_EX_FLAG_FROM_ADDRESS,
                                reinterpret_cast<const wchar_t*>(&holdThisLibrary), &module) != 0;
}

bool leaveFileOpen() {
    return ::CreateFileW(L"NUL", GENERIC_READ, FILE_SHARE_READ, nullptr, OPEN_EXISTING, 0,
                         nullptr) != INVALID_HANDLE_VALUE;
}

bool leaveThreadRunning() {
    const auto wait = [](void*) -> DWORD {
        for (;;)
            ::Sleep(INFINITE);
    };
    const HANDLE thread = ::CreateThread(nullptr, 0, wait, nullptr, 0, nullptr);
    return thread && ::CloseHandle(thread) != 0;
}

bool hasStandardInput() {
    return ::GetStdHandle(STD_INPUT_HANDLE) != nullptr;
}

} // namespace Mz::Test
