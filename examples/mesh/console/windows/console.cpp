// SPDX-License-Identifier: BSL-1.0
/// On Windows names are wide, and the output is UTF-8 bytes in binary mode, so that it equals the
/// output on Linux.
#include "../console.h"

#include "components/componentManager/utf8.h"

#include <fcntl.h>
#include <io.h>
#include <stdio.h>

namespace Meshes::console {

void useBinaryOutput() {
    ::_setmode(::_fileno(stdout), _O_BINARY);
    ::_setmode(::_fileno(stderr), _O_BINARY);
}

std::string outputText(std::wstring_view text) {
    return Mz::toUtf8(text);
}

} // namespace Meshes::console
