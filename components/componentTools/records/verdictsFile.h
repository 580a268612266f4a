// SPDX-License-Identifier: BSL-1.0
/// Reads and writes the verdicts that a scan saves beside its list.
#pragma once

#include "components/componentTools/recordedLibrary.h"

#include <filesystem>

namespace Mz::Tools {

/// Sets the saved verdicts of libraries without builders. Ignores a verdict if the library's time
/// or size differs. Ignores a file that is missing or invalid.
void readVerdicts(const std::filesystem::path& file, RecordedLibraries& libraries);

/// Writes the saved verdicts atomically. Throws what `replaceFile` throws.
void writeVerdicts(const std::filesystem::path& file, const RecordedLibraries& libraries);

} // namespace Mz::Tools
