/// Filling a recorded list without putting the host at risk.
#pragma once

#include "components/componentTools/discovery.h"
#include "components/componentTools/probe.h"
#include "components/componentTools/recordedList.h"

#include "components/componentManager/processControl.h"

#include <filesystem>
#include <string>
#include <vector>

namespace Mz::Tools {

struct ScanOptions {
    /// The folders to search, in the host's order; see `foldersOf`.
    std::vector<std::filesystem::path> folders;
    /// The list to bring up to date; empty to record nothing.
    std::filesystem::path list;
    /// Try libraries that failed earlier again, though they have not changed.
    bool retry = false;
    /// For each library; when `interrupted` answers true, the whole scan ends.
    ProbeOptions probe;
    /// Hears of the progress and is asked whether to stop; null for nobody.
    QrProcessControl* controller = nullptr;
};

/// What became of one file.
struct ScannedFile {
    std::filesystem::path path;
    std::wstring directory, fileName; ///< as recorded
    Finding verdict;
    std::vector<Finding> notes;
    bool recorded = false; ///< whether `libraries` has it
    bool looked = false;   ///< false when the list had it already, and it has not changed
    bool folder = false;   ///< one of the folders, which could not be searched
};

struct ScanResult {
    std::vector<ScannedFile> files; ///< in the host's order, those left out behind them
    RecordedLibraries libraries;    ///< what was, or should have been, written
    /// What needs its host (`needsHost`), without builders; not written.
    RecordedLibraries unjudged;
    std::wstring rejected;        ///< why the old list was rejected; empty when it was not
    std::filesystem::path keptAs; ///< where a copy of what was rejected is; empty for nowhere
    std::wstring notWritten;      ///< names the file that was not written, and says why
    bool interrupted = false;     ///< the user stopped it; the rest of the old list was kept
};

/// Scans the folders, loading each library that is new, has changed, or lacks something that may
/// have arrived meanwhile, in a process of its own, and writes the list.
///
/// A library that fails is recorded with its time and size and no builders, so a host that reads
/// the list does not load it either, until its file changes. What was wrong is kept beside the
/// list, in the file `verdictsFileOf(list)`. What is no component library is recorded in the same
/// way, as the manager does.
///
/// A library that needs its host's own program cannot be tried. It is not recorded, so a host loads
/// it at each start. A program that must not load it adds `unjudged` to the list for its manager.
///
/// A damaged or foreign list is rejected whole and built anew; a copy of it stays beside the new
/// one, with ".rejected" behind its name. Two scans at once do not damage each other: each writes a
/// whole list, and the later one stays.
///
/// When the process to load libraries in cannot be started, that says nothing of the libraries:
/// they are not recorded, but for what the old list has of those that have not changed, and where
/// none could be loaded nothing is written. A list that cannot be written takes none of the
/// findings away.
MZ_COMPONENT_TOOLS_API ScanResult scan(const ScanOptions& options);

} // namespace Mz::Tools
