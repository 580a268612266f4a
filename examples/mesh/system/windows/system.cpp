// SPDX-License-Identifier: BSL-1.0
/// The loaded libraries come from the process status API.
#include "../system.h"

#include <windows.h>

#include <psapi.h>

#include <string>
#include <vector>

namespace Meshes::system {

namespace {

std::filesystem::path fileOf(HMODULE module) {
    std::wstring name(32768, L'\0'); // The longest name of the system.
    const DWORD length = ::GetModuleFileNameW(module, name.data(), static_cast<DWORD>(name.size()));
    name.resize(length);
    return name;
}

} // namespace

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
