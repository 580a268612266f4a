/// On Windows names are wide, and the output is UTF-8 bytes in binary mode, so that it equals the
/// output on Linux. The arguments come from the wide command line, because `argv` is limited to the
/// code page.
#include "../console.h"

#include <windows.h>

#include <fcntl.h>
#include <io.h>
#include <shellapi.h>
#include <stdio.h>

namespace Meshes::console {

void useBinaryOutput() {
    ::_setmode(::_fileno(stdout), _O_BINARY);
    ::_setmode(::_fileno(stderr), _O_BINARY);
}

std::vector<std::filesystem::path> arguments(int, char**) {
    int count = 0;
    wchar_t** const words = ::CommandLineToArgvW(::GetCommandLineW(), &count);
    if (!words)
        return {};
    std::vector<std::filesystem::path> result(words + (count > 0 ? 1 : 0), words + count);
    ::LocalFree(words);
    return result;
}

std::filesystem::path programFolder() {
    std::wstring name(MAX_PATH, L'\0');
    while (true) {
        const auto size = static_cast<DWORD>(name.size());
        const DWORD length = ::GetModuleFileNameW(nullptr, name.data(), size);
        if (length < size) {
            name.resize(length);
            return std::filesystem::path(name).parent_path();
        }
        name.resize(name.size() * 2);
    }
}

std::wstring wideName(const std::filesystem::path& path) {
    return path.native();
}

std::wstring fileText(const std::filesystem::path& path) {
    return path.native();
}

std::string outputText(std::wstring_view text) {
    const auto length = static_cast<int>(text.size());
    const int size =
        ::WideCharToMultiByte(CP_UTF8, 0, text.data(), length, nullptr, 0, nullptr, nullptr);
    std::string result(static_cast<std::size_t>(size), '\0');
    ::WideCharToMultiByte(CP_UTF8, 0, text.data(), length, result.data(), size, nullptr, nullptr);
    return result;
}

} // namespace Meshes::console
