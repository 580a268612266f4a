// SPDX-License-Identifier: BSL-1.0
/// Checks a shared library without loading it.
#pragma once

#include "components/platform/platform.h"

namespace Mz::platform {

/// Returns whether the open file is a shared library for this processor that exports the function
/// `symbol`: its dynamic symbol table defines it, visible to other libraries.
///
/// Reads a few small pieces of the file, whatever its size, and does not trust its contents.
/// The result is `absent` for damaged, truncated and all other files, and `unknown` if the system
/// could not read the file.
ExportState elfExportsFunction(int descriptor, const char* symbol);

} // namespace Mz::platform
