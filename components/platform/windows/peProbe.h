// SPDX-License-Identifier: BSL-1.0
/// Checks a Windows library without mapping it. Compiled on every system, so that tests and the
/// fuzzer on Linux cover it.
#pragma once

#include "components/platform/fileBlocks.h"

namespace Mz::platform {

/// Returns whether the file is a DLL for x86-64 that exports the function `symbol` by name, from
/// its own code.
///
/// Reads a few small pieces of the file, whatever its size, and does not trust its contents.
/// Returns false for programs, forwarded exports, and damaged or truncated files.
bool peExportsFunction(ByteSource& source, const char* symbol);

} // namespace Mz::platform
