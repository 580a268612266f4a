/// Looking into a shared library without loading it.
#pragma once

namespace Mz::platform {

/// Whether the open file is a shared library for this processor whose dynamic symbol table defines
/// the function `symbol`, for others to see.
///
/// Reads a few small pieces of the file, whatever its size; nothing in it is trusted. What is
/// damaged, truncated or anything else than such a library gives false.
bool elfExportsFunction(int descriptor, const char* symbol);

} // namespace Mz::platform
