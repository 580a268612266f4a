// SPDX-License-Identifier: BSL-1.0
/// A recorded list in memory.
#pragma once

#include "components/componentTools/recordedLibrary.h"

#include <iosfwd>

namespace Mz::Tools {

/// Reads a list to its last byte, with the checks of `readRecordedList`.
/// \throws std::exception at the first invalid value
RecordedLibraries readRecords(std::istream& stream);

} // namespace Mz::Tools
