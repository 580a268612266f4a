/// The verdicts that a scan keeps beside its list.
#pragma once

#include "components/componentTools/recordedList.h"

#include <filesystem>

namespace Mz::Tools {

/// Fills in what is kept of the libraries, as far as it is of the same state of the file. Of a file
/// that is not there or makes no sense, nothing is.
void readVerdicts(const std::filesystem::path& file, RecordedLibraries& libraries);

/// Writes what is kept, as `replaceFile` does.
void writeVerdicts(const std::filesystem::path& file, const RecordedLibraries& libraries);

} // namespace Mz::Tools
