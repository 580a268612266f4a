// SPDX-License-Identifier: BSL-1.0
#include "tests/unit/openFiles.h"

#include <windows.h>

namespace Mz::Test {

bool isOpen(const std::filesystem::path& file) {
    // The C runtime opens files without FILE_SHARE_DELETE, so a request to delete an open file
    // fails.
    const HANDLE handle =
        ::CreateFileW(file.c_str(), DELETE, FILE_SHARE_READ | FILE_SHARE_WRITE | FILE_SHARE_DELETE,
                      nullptr, OPEN_EXISTING, FILE_ATTRIBUTE_NORMAL, nullptr);
    if (handle == INVALID_HANDLE_VALUE)
        return ::GetLastError() == ERROR_SHARING_VIOLATION;
    ::CloseHandle(handle);
    return false;
}

} // namespace Mz::Test
