// SPDX-License-Identifier: BSL-1.0
/// The verdicts on a file that is, or should be, a component library. Each has a sentence for
/// people and, where possible, a hint how to solve the problem.
#pragma once

#include "components/componentTools/export.h"

#include <optional>
#include <string>
#include <string_view>

namespace Mz::Tools {

/// The kind of a finding. The numeric values may change between versions: store the name
/// (`nameOf`). Since 0.2: `otherAbi`, `needsHost`, `unreachable`, `notAFolder`, `answerLost`,
/// `answerTooLong`, `onPath`, `notOnPath`, `uidNil`, `otherInterface`, `disabledByUser`.
enum class Verdict {
    // Good.
    component,     ///< a component library, as far as reading the file can show
    works,         ///< loads, and describes builders
    offersNothing, ///< loads, and describes no builder

    // Not a component library. The manager correctly skips the file.
    directory,
    hidden,
    systemFile,     ///< it has the system attribute (Windows)
    notRegular,     ///< a pipe or a device
    notALibrary,    ///< neither a library nor a program for Linux or Windows
    program,        ///< an executable program
    noEntryPoint,   ///< a library that does not export "QrGetComponentDescription" itself
    disabledByUser, ///< the user switched it off, see `disabled.h`

    // Faults that reading the file or its folder shows.
    missing,
    unreachable, ///< a folder above it denies access
    notAFolder,  ///< the search path names a file
    unreadable,
    nameNotCarried, ///< the name cannot be encoded in the locale
    notSearchable,  ///< a folder whose name contains ';', the separator of search paths
    sameName,       ///< its name equals that of another file except for case
    otherSystem,
    otherProcessor,
    otherAbi,       ///< its stamp names another ABI or SOVERSION than that of this library
    otherInterface, ///< an interface differs from that of its host; see `MZ_INTERFACE`
    damaged,
    entryPointNoFunction, ///< the exported entry point is not a function of this library
    dependencyMissing,

    // Faults that loading and describing the library in a child process shows.
    loadFailed,
    needsHost, ///< it needs the program of its host, and cannot be loaded elsewhere
    nullDescription,
    wrongInterface, ///< the description does not support `QrComponentDescription`
    wrongItem,      ///< an enumerated object is null or does not support `QrBuilderDescription`
    threw,
    crashed,
    aborted,
    exited, ///< it ended the process by `exit` or similar
    timedOut,
    outOfMemory,
    textNotCarried, ///< a text of a builder cannot be encoded in the locale
    garbled,        ///< the report of the child process is invalid
    answerLost,     ///< the child process ended regularly, but its report did not arrive
    answerTooLong,  ///< the report of the child process exceeds the limit
    probeFailed,    ///< the child process could not be started
    endUnknown,     ///< the exit status of the child process is not available
    interrupted,    ///< the user stopped the check

    // The file's record in a recorded list.
    notRecorded,
    recordedUnchanged,
    recordedFailed, ///< recorded without builders: a host does not load it until it changes
    recordedChanged,

    // Whether a host's search path leads to the file.
    onPath,
    notOnPath,

    // Notes on its builders.
    miscounted, ///< the announced number of builders differs from the enumerated one
    uidTaken,   ///< another library has the uid and wins
    uidWins,    ///< another library has the uid and loses
    uidNil,     ///< the uid is nil, usually because it was forgotten
    uidTwice,   ///< the library has the uid twice
};

/// How serious a verdict is.
enum class Severity {
    good,      ///< a component library
    bystander, ///< not a component library, or one without builders; not a fault
    note,      ///< additional information
    fault,     ///< a problem that must be solved
};

/// Returns the verdict's name, which is the enumerator's. Names never change.
MZ_COMPONENT_TOOLS_API const char* nameOf(Verdict verdict);

/// Returns the verdict with that name; `std::nullopt` if there is none.
MZ_COMPONENT_TOOLS_API std::optional<Verdict> verdictNamed(std::string_view name);

/// Returns how serious the verdict is.
MZ_COMPONENT_TOOLS_API Severity severityOf(Verdict verdict);

/// A verdict on one file, with the details for its sentence.
struct Finding {
    Verdict verdict = Verdict::component; ///< what was found
    std::wstring subject; ///< for example the name of a library, a stage or a number
    std::wstring words;   ///< for example the text of an exception or of the loader, or a file name

    /// Returns whether all three are equal.
    friend bool operator==(const Finding&, const Finding&) = default;
};

/// Returns the finding as a sentence without a full stop.
MZ_COMPONENT_TOOLS_API std::wstring sentenceOf(const Finding& finding);

/// Returns the remedy as a sentence without a full stop; empty if there is none.
MZ_COMPONENT_TOOLS_API std::wstring cureOf(const Finding& finding);

} // namespace Mz::Tools
