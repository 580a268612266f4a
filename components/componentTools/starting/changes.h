// SPDX-License-Identifier: BSL-1.0
/// Which components changed between the starts of a host.
#pragma once

#include "components/componentTools/recordedLibrary.h"

#include <filesystem>
#include <set>
#include <string>
#include <utility>

namespace Mz::Tools {

/// The names of component libraries: directory and file name, normalised.
using LibraryNames = std::set<std::pair<std::wstring, std::wstring>>;

/// Returns the components that changed last: those that are new or have another time or size than
/// at the start before. If none has, returns those that changed at an earlier start.
///
/// The file `LIST.starts.json` is updated for the next start. If it is missing or not valid, all
/// components are new. If it cannot be written, the next start compares with an older one.
/// \param components  the components of this start
LibraryNames changedLast(const std::filesystem::path& list, const RecordedLibraries& components);

} // namespace Mz::Tools
