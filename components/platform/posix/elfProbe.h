// SPDX-License-Identifier: BSL-1.0
/// Checks a shared library without loading it.
#pragma once

namespace Mz::platform {

/// Returns whether the open file is a shared library for this processor that exports the function
/// `symbol`: its dynamic symbol table defines it, visible to other libraries.
///
/// Reads a few small pieces of the file, whatever its size, and does not trust its contents.
/// Returns false for damaged, truncated and all other files.
bool elfExportsFunction(int descriptor, const char* symbol);

} // namespace Mz::platform
