// SPDX-License-Identifier: BSL-1.0
/// On Windows names are wide, and the output is UTF-8 bytes in binary mode, so that it equals the
/// output on Linux. The arguments come from the wide command line, because `argv` is limited to the
/// code page.
#include "../console.h"

#include "components/componentManager/utf8.h"

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

std::string outputText(std::wstring_view text) {
    return Mz::toUtf8(text);
}

} // namespace Meshes::console
