// SPDX-License-Identifier: BSL-1.0
/// Checks a file with the reader of Windows libraries.
#pragma once

#include "components/platform/platform.h"

namespace Mz::platform {

/// Returns whether the file exports the function `symbol`, by the tables in the file. Does not map
/// the file.
///
/// \param path  the full path of the file
ExportState readExport(const NativePath& path, const char* symbol);

/// Returns whether `error`, a code of `GetLastError`, means that an operation failed for lack of
/// resources, not because of the file.
bool isShortage(unsigned long error);

} // namespace Mz::platform
