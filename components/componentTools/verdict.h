/// What can be said of a file that is, or should be, a component library: verdicts, each with a
/// sentence that a person understands and, where there is one, the cure.
#pragma once

#include "components/componentTools/export.h"

#include <optional>
#include <string>
#include <string_view>

namespace Mz::Tools {

/// One answer. New ones may be added at any place: store the names (`nameOf`), not the numbers.
enum class Verdict {
    // All is well.
    component,     ///< a component library, as far as can be seen without running it
    works,         ///< loads, and describes builders
    offersNothing, ///< loads, and describes no builder

    // The manager passes the file over, and rightly so.
    directory,
    hidden,
    systemFile,   ///< by its attributes, where the system knows such
    notRegular,   ///< a pipe, a device
    notALibrary,  ///< neither a library nor a program of any system known here
    program,      ///< to be started, not to be loaded
    noEntryPoint, ///< a library that does not export "QrGetComponentDescription" itself

    // Faults that show without running anything.
    missing,
    unreachable, ///< a folder above it may not be entered
    notAFolder,  ///< a search path names a file
    unreadable,
    nameNotCarried, ///< the locale has no form for the name
    notSearchable,  ///< a folder whose name has the separator of search paths in it
    sameName,       ///< another file has the same name but for the case of letters
    otherSystem,
    otherProcessor,
    damaged,
    entryPointNoFunction, ///< exported, but as data
    dependencyMissing,

    // Faults that show when the library is loaded and described in a process of its own.
    loadFailed,
    needsHost, ///< needs its host's own program, so it loads nowhere else
    nullDescription,
    wrongInterface, ///< the description does not answer for `QrComponentDescription`
    wrongItem,      ///< one of the builders offered is none
    threw,
    crashed,
    aborted,
    exited, ///< ended the process itself
    timedOut,
    outOfMemory,
    textNotCarried, ///< the locale has no form for a text of a builder
    garbled,        ///< the process answered with something else than an answer
    answerLost,     ///< the process came to its end, and its answer did not arrive
    answerTooLong,  ///< the process answered with more than a description may have
    probeFailed,    ///< the process could not be started
    endUnknown,     ///< the system does not tell this program how the process ended
    interrupted,    ///< the user wanted it to end

    // What a recorded list says of the file.
    notRecorded,
    recordedUnchanged,
    recordedFailed, ///< recorded without builders: not tried again until it changes
    recordedChanged,

    // Whether a host's search path leads to the file.
    onPath,
    notOnPath,

    // What is worth knowing of its builders.
    miscounted, ///< another number was announced than given
    uidTaken,   ///< another library has the identifier and wins
    uidWins,    ///< another library has the identifier and loses
    uidNil,     ///< the identifier is nil, forgotten as a rule
    uidTwice,   ///< the library itself offers the identifier twice
};

enum class Severity {
    good,
    bystander, ///< no component library, and no fault of anybody
    note,      ///< worth knowing, no judgement by itself
    fault,
};

/// The verdict's name, as it is spelled above; stable.
MZ_COMPONENT_TOOLS_API const char* nameOf(Verdict verdict);

/// The verdict with that name, if there is one.
MZ_COMPONENT_TOOLS_API std::optional<Verdict> verdictNamed(std::string_view name);

MZ_COMPONENT_TOOLS_API Severity severityOf(Verdict verdict);

/// A verdict on one file, and what it is about.
struct Finding {
    Verdict verdict = Verdict::component;
    std::wstring subject; ///< what it is about: a library's name, a stage, a number
    std::wstring words; ///< what somebody else said: the loader, an exception, another file's name

    friend bool operator==(const Finding&, const Finding&) = default;
};

/// What is the matter, in a sentence without a full stop.
MZ_COMPONENT_TOOLS_API std::wstring sentenceOf(const Finding& finding);

/// What to do about it, likewise; empty where there is nothing to be done.
MZ_COMPONENT_TOOLS_API std::wstring cureOf(const Finding& finding);

} // namespace Mz::Tools
