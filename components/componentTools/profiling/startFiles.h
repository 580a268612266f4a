// SPDX-License-Identifier: BSL-1.0
/// The candidates of a start, with their records, as the component manager finds them.
#pragma once

#include "components/componentTools/recordedList.h"
#include "components/platform/platform.h"

#include <optional>
#include <string>
#include <vector>

namespace Mz::Tools {

/// One candidate. Unlike `discover`, files whose names differ only in case are separate candidates
/// where the system has both.
struct StartFile {
    std::wstring directory, fileName; ///< normalised
    platform::NativePath found;       ///< as the search path and the system spell it
    const RecordedLibrary* record = nullptr;

    /// Returns the path by which the manager opens the file.
    platform::NativePath openingPath() const {
        return platform::openingPath(directory, fileName, found);
    }
};

/// Lists the candidates, in the order in which the manager examines them, without records.
std::vector<StartFile> listStartFiles(const std::wstring& searchPath);

/// Finds the record of each file. `recorded` must outlive the files.
void findRecords(std::vector<StartFile>& files, const RecordedLibraries& recorded);

/// Returns whether the file has the time and size of its record.
bool isUnchanged(const StartFile& file, const platform::FileStatus& status);

} // namespace Mz::Tools
