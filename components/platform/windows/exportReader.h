/// Opens a file for the reader of Windows libraries.
#pragma once

#include "components/platform/platform.h"

namespace Mz::platform {

/// Returns what the file's own tables say of the function `symbol`; maps nothing. `path` must be a
/// full one.
ExportState readExport(const NativePath& path, const char* symbol);

/// Returns whether `error`, one of the system's codes, says that an operation failed for want of
/// resources and not because of the file.
bool isShortage(unsigned long error);

} // namespace Mz::platform
