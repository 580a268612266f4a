// SPDX-License-Identifier: BSL-1.0
/// A handle that lets no one else write to the file. The system closes it when the process ends,
/// however it does.
#include "components/componentTools/platform/system.h"

#include <windows.h>

namespace Mz::Tools::System {

namespace {

HANDLE handleOf(std::intptr_t number) {
    return reinterpret_cast<HANDLE>(number);
}

} // namespace

bool HeldFile::create(const NativePath& file) {
    const HANDLE opened =
        ::CreateFileW(file.c_str(), GENERIC_WRITE, FILE_SHARE_READ | FILE_SHARE_DELETE, nullptr,
                      CREATE_ALWAYS, FILE_ATTRIBUTE_NORMAL, nullptr);
    if (opened == INVALID_HANDLE_VALUE)
        return false;
    path = file;
    handle = reinterpret_cast<std::intptr_t>(opened);
    return true;
}

bool HeldFile::write(const std::string& content) {
    DWORD written = 0;
    return ::SetFilePointer(handleOf(handle), 0, nullptr, FILE_BEGIN) == 0 &&
           ::WriteFile(handleOf(handle), content.data(), static_cast<DWORD>(content.size()),
                       &written, nullptr) &&
           written == content.size() && ::SetEndOfFile(handleOf(handle));
}

void HeldFile::remove() {
    if (handle == -1)
        return;
    ::CloseHandle(handleOf(handle));
    handle = -1;
    ::DeleteFileW(path.c_str());
}

HeldFile::~HeldFile() {
    if (handle != -1)
        ::CloseHandle(handleOf(handle));
}

bool isHeld(const NativePath& file) {
    const HANDLE opened = ::CreateFileW(file.c_str(), GENERIC_WRITE,
                                        FILE_SHARE_READ | FILE_SHARE_WRITE | FILE_SHARE_DELETE,
                                        nullptr, OPEN_EXISTING, FILE_ATTRIBUTE_NORMAL, nullptr);
    if (opened != INVALID_HANDLE_VALUE) {
        ::CloseHandle(opened);
        return false;
    }
    return ::GetLastError() == ERROR_SHARING_VIOLATION;
}

} // namespace Mz::Tools::System
