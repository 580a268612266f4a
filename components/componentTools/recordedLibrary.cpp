// SPDX-License-Identifier: BSL-1.0
/// A linear search: lists have some thousand records at most, and callers look up one file.
#include "components/componentTools/recordedLibrary.h"

namespace Mz::Tools {

const RecordedLibrary* findRecord(const RecordedLibraries& libraries, const std::wstring& directory,
                                  const std::wstring& fileName) {
    for (const RecordedLibrary& library : libraries)
        if (library.fileName == fileName && library.directory == directory)
            return &library;
    return nullptr;
}

} // namespace Mz::Tools
