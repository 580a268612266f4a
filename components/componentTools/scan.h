// SPDX-License-Identifier: BSL-1.0
/// Fills a recorded list in child processes, so that a faulty library cannot harm the host.
#pragma once

#include "components/componentTools/discovery.h"
#include "components/componentTools/probe.h"
#include "components/componentTools/recordedList.h"

#include "components/componentManager/processControl.h"

#include <cstddef>
#include <filesystem>
#include <string>
#include <vector>

namespace Mz::Tools {

/// The options of `scan`.
struct ScanOptions {
    /// The folders to search, in the host's order; see `foldersOf`.
    std::vector<std::filesystem::path> folders;
    /// The list to update; empty to write none.
    std::filesystem::path list;
    /// Programs and libraries of the host, with which the interfaces of each library are compared:
    /// see `ExplainOptions::hosts`. Since 0.2.
    std::vector<std::filesystem::path> hosts;
    /// Retry unchanged libraries that failed earlier.
    bool retry = false;
    /// The limits for each library. If `interrupted` returns true, the whole scan stops.
    ProbeOptions probe;
    /// Receives the progress and decides whether to stop; may be null. The caller owns it.
    QrProcessControl* controller = nullptr;
    /// How many libraries to try at a time; 0 for the number of processors. Since 0.2.
    ///
    /// The result and the list are the same as with one. So are the callbacks: `scan` calls all of
    /// them in the thread of its caller, never two at once, and reports libraries in the host's
    /// order. The limits hold for each library; together they may use `jobs` times the memory.
    ///
    /// The default is one, because libraries that are loaded at the same time may disturb each
    /// other: two that open the same port, device or file as they are loaded work one by one, and
    /// fail together. Such a failure would be recorded.
    std::size_t jobs = 1;
};

/// The result for one file or folder.
struct ScannedFile {
    std::filesystem::path path; ///< in full
    std::wstring directory;     ///< as recorded
    std::wstring fileName;      ///< as recorded
    Finding verdict;            ///< the most important finding
    std::vector<Finding> notes; ///< findings on its builders
    bool recorded = false;      ///< whether `libraries` has it
    bool looked = false;        ///< whether it was examined now; false if its old record was used
    bool folder = false;        ///< true for a search folder that could not be searched
};

/// The result of `scan`.
struct ScanResult {
    std::vector<ScannedFile> files; ///< in the host's order, followed by those left out
    RecordedLibraries libraries;    ///< the new list, whether or not it could be written
    /// The libraries with the verdict `needsHost`, without builders. They are not in the list.
    RecordedLibraries unjudged;
    std::wstring rejected;        ///< why the old list was rejected; empty if it was not
    std::filesystem::path keptAs; ///< the copy of a rejected list; empty if there is none
    std::wstring notWritten;      ///< the file that was not written, and why; empty if all were
    bool interrupted = false;     ///< the user stopped the scan
};

/// Scans the folders and writes the list. Blocks until the scan has ended.
///
/// Each library is loaded in a child process if it is new, has changed, or failed for a reason that
/// may have disappeared, such as a missing dependency. Other libraries keep their record. A library
/// whose stamp names another ABI (`otherAbi`), or whose interfaces differ from those of the host
/// (`otherInterface`), is not loaded, and loses the builders of its record.
///
/// A library that fails is recorded with its time and size and no builders. A host that reads the
/// list does not load it until its file changes. The verdict is saved beside the list, in the file
/// `verdictsFileOf(list)`. A file that is not a component library is recorded in the same way, as
/// by the manager.
///
/// A component that the user switched off (`disabled.h`) is recorded without builders and not
/// examined, whether or not its file has changed.
///
/// A library that needs its host's program cannot be tried. It is not recorded, and a host loads it
/// at each start. A program that must not load it adds `unjudged` to the list that it passes to its
/// manager.
///
/// A damaged file, or one that is not a list, is rejected as a whole and replaced by a new list. A
/// copy is saved beside it, with ".rejected" appended to its name. Two concurrent scans do not
/// damage the list: each writes it atomically, and the last one wins.
///
/// If the child process cannot be started, unchanged libraries keep their record and the others are
/// not recorded. If no library could be tried for that reason, no list is written. If the list
/// cannot be written, `notWritten` is set and the rest of the result is valid. After an
/// interruption, libraries that were not examined keep their record.
/// \throws whatever `options.probe.interrupted` or the controller throws
MZ_COMPONENT_TOOLS_API ScanResult scan(const ScanOptions& options);

} // namespace Mz::Tools
