/// Looks into a Windows library without mapping it.
///
/// Compiled on every system, so that the tests and the fuzzer of Linux reach it too.
#pragma once

#include "components/platform/fileBlocks.h"

namespace Mz::platform {

/// Returns whether the file is a DLL for x86-64 whose export table names the function `symbol` and
/// leads to code of that DLL.
///
/// Reads a few small pieces of the file, whatever its size; nothing in it is trusted. Returns false
/// for programs, for forwarded exports and for damaged or truncated files.
bool peExportsFunction(ByteSource& source, const char* symbol);

} // namespace Mz::platform
