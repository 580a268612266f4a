/// Flushes the file before the rename, and lets the system write the rename through: otherwise the
/// name may lead to an empty file after a crash. The loaded libraries come from the process status
/// API.
#include "../system.h"

#include <windows.h>

#include <psapi.h>

#include <string>
#include <vector>

namespace Meshes::system {

namespace {

std::error_code lastError() {
    return {static_cast<int>(::GetLastError()), std::system_category()};
}

std::error_code synchronise(const std::filesystem::path& path) {
    const HANDLE file =
        ::CreateFileW(path.c_str(), GENERIC_WRITE, FILE_SHARE_READ | FILE_SHARE_WRITE, nullptr,
                      OPEN_EXISTING, FILE_ATTRIBUTE_NORMAL, nullptr);
    if (file == INVALID_HANDLE_VALUE)
        return lastError();
    const std::error_code result = ::FlushFileBuffers(file) ? std::error_code() : lastError();
    ::CloseHandle(file);
    return result;
}

std::filesystem::path fileOf(HMODULE module) {
    std::wstring name(32768, L'\0'); // The longest name of the system.
    const DWORD length = ::GetModuleFileNameW(module, name.data(), static_cast<DWORD>(name.size()));
    name.resize(length);
    return name;
}

} // namespace

std::error_code createNew(const std::filesystem::path& path) {
    const HANDLE file = ::CreateFileW(path.c_str(), GENERIC_WRITE, 0, nullptr, CREATE_NEW,
                                      FILE_ATTRIBUTE_NORMAL, nullptr);
    if (file == INVALID_HANDLE_VALUE)
        return ::GetLastError() == ERROR_FILE_EXISTS ? std::make_error_code(std::errc::file_exists)
                                                     : lastError();
    ::CloseHandle(file);
    return {};
}

std::error_code moveSafely(const std::filesystem::path& from, const std::filesystem::path& to) {
    if (const std::error_code failure = synchronise(from))
        return failure;
    if (!::MoveFileExW(from.c_str(), to.c_str(),
                       MOVEFILE_REPLACE_EXISTING | MOVEFILE_WRITE_THROUGH))
        return lastError();
    return {};
}

std::size_t mappedLibraries(const std::filesystem::path& folder) {
    std::vector<HMODULE> modules(1024);
    const auto size = static_cast<DWORD>(modules.size() * sizeof(HMODULE));
    DWORD needed = 0;
    if (!::EnumProcessModules(::GetCurrentProcess(), modules.data(), size, &needed))
        return 0;
    modules.resize(std::min<std::size_t>(modules.size(), needed / sizeof(HMODULE)));
    std::size_t found = 0;
    for (const HMODULE module : modules) {
        std::error_code ignored;
        if (std::filesystem::equivalent(fileOf(module).parent_path(), folder, ignored))
            ++found;
    }
    return found;
}

} // namespace Meshes::system
