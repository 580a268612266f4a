// SPDX-License-Identifier: BSL-1.0
/// The system functions of a command-line program: one declaration, and one implementation per
/// system, selected by the build.
#pragma once

#include <string>
#include <string_view>

namespace Meshes::console {

/// Makes the standard output and error write bytes unchanged, line ends included, so that the
/// output is the same on every system. Call it before anything is written.
void useBinaryOutput();

/// Returns text as it is written to the standard output; the reverse of `Kit::wideName`. On Linux
/// the bytes of a name are unchanged, on Windows the output is UTF-8.
std::string outputText(std::wstring_view text);

} // namespace Meshes::console
