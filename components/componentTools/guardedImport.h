// SPDX-License-Identifier: BSL-1.0
/// Imports a file in a child process, so that an importer that crashes, hangs or takes all memory
/// does not harm the host.
///
///     const Mz::Kit::GuardedImport import = Mz::Kit::importGuarded("part.obj");
///     if (!import)
///         std::wcerr << import.sentence() << L'\n';
///     else
///         show(import.object);
///
/// The child process is `mzcomponents-probe`. It inherits the open file, runs the importers, and
/// sends the object back in its stored form (`objectIO.h`). The host reads that form; the object is
/// then the host's own. Only objects of persistent classes can come back, with everything that they
/// refer to.
///
/// What the guard does not cover: the host loads the library of the object's class and runs its
/// `read` and `loadFinished` on data that a hostile importer chose. `ImportLimits::classes` limits
/// which classes that can be.
#pragma once

#include "components/componentManager/cast.h"
#include "components/componentManager/uid.h"
#include "components/componentTools/export.h"

#include <chrono>
#include <cstdint>
#include <filesystem>
#include <string>
#include <vector>

namespace Mz::Kit {

/// The limits of a guarded import, and which importers it uses.
struct ImportLimits {
    /// The time for everything, from the start of the process to the stored object. Then the
    /// process is killed.
    std::chrono::milliseconds time{60'000};
    /// The memory, in bytes, that the process may use. Then it is killed. The use is polled about a
    /// hundred times a second; requests far above the limit are denied by the system.
    std::uint64_t memory = std::uint64_t{1} << 30;
    /// The largest stored object that is accepted, in bytes. The host holds it in memory.
    std::uint64_t answer = std::uint64_t{256} << 20;
    /// The largest number of objects, references and nulls in the stored object.
    std::uint64_t objects = 10'000'000;
    /// How often the importer may call the process controller.
    std::uint64_t calls = 100'000;
    /// The builder name of the importers to ask; empty for all import builders. Asking all of them
    /// loads their libraries into the child process.
    std::wstring builderName;
    /// The classes of which objects are accepted, at any depth; empty for all that the component
    /// manager can make.
    std::vector<QrUid> classes;
    /// The search path for component libraries in the child process; empty for the folders of the
    /// libraries that the component manager of this process knows. On Linux, set it if two of the
    /// folders differ only in letter case.
    std::wstring searchPath;
    /// The program to run; empty for `mzcomponents-probe` in the folder of libMZcomponentTools.
    std::filesystem::path program;
};

/// The result of a guarded import. The numeric values may change between versions: store the name
/// (`nameOf`).
enum class ImportVerdict {
    imported,
    fileMissing,    ///< there is no such file, or it cannot be read
    noManager,      ///< the component manager of this process is not initialised
    noClass,        ///< none of `ImportLimits::classes` can be made; nothing was run
    notTaken,       ///< no import builder takes the file
    gaveNothing,    ///< the import builder took the file and returned null
    notPersistent,  ///< an object cannot be stored; the class is named
    unknownClass,   ///< the component manager has no builder for the class of an object
    notStored,      ///< an object threw when it was stored
    threw,          ///< an import builder let an exception out
    programAborted, ///< an import builder called the process controller's `abort`
    crashed,        ///< the process ended by a fault or signal
    aborted,        ///< the process ended by `abort` or `std::terminate`
    exited,         ///< an import builder ended the process by `exit` or similar
    timedOut,       ///< `ImportLimits::time`
    outOfMemory,    ///< `ImportLimits::memory`
    interrupted,    ///< the process controller of the caller was interrupted
    answerTooLong,  ///< `ImportLimits::answer`
    tooManyCalls,   ///< `ImportLimits::calls`
    garbled,        ///< what the process sent breaks the protocol
    answerLost,     ///< the process ended without a result
    answerRejected, ///< the stored object is damaged or breaks a limit
    guardFailed,    ///< the process could not be started
};

/// Returns the verdict's name, which is the enumerator's. Names never change.
MZ_COMPONENT_TOOLS_API const char* nameOf(ImportVerdict verdict);

/// What became of a guarded import.
struct GuardedImport {
    ImportVerdict verdict = ImportVerdict::guardFailed; ///< what happened
    QrRef<QrCastable> object;   ///< null unless the verdict is `imported`. The caller owns it
    std::filesystem::path file; ///< as the caller gave it
    /// The activity at which the process ended, for example L"the import by \"Wavefront OBJ\"".
    std::wstring activity;
    /// Details for the sentence: the label of the import builder if it succeeded, else for example
    /// the name of a class, the text of an exception, the name of a signal or the limit.
    std::wstring detail;
    // What the system took from the child process (Linux):
    bool withoutFiles = false;     ///< it could not create, change or remove files
    bool withoutNetwork = false;   ///< it could not open connections
    bool withoutProcesses = false; ///< it could not start processes, or affect others

    /// Returns whether there is an object.
    explicit operator bool() const { return verdict == ImportVerdict::imported; }

    /// Returns what happened and, where there is one, the remedy, without the name of the file.
    MZ_COMPONENT_TOOLS_API std::wstring reason() const;

    /// Returns the name of the file and the reason as a sentence.
    MZ_COMPONENT_TOOLS_API std::wstring sentence() const;
};

/// Imports `file` in a child process. Blocks until the process has ended.
///
/// The component manager of this process must be initialised. The child process knows the same
/// component libraries. It asks the import builders as `QrBaseImporter` does: first those that read
/// the file's extension, then all of them, in the manager's order.
///
/// **Process controller.** The importer's calls reach the controller of the calling thread
/// (`QrGetProcessController`), on that thread: messages, warnings, errors, log, status, progress
/// and `findFile`. Progress and status are relayed at most every 10 ms, except the first and, for
/// progress, the last (1.0). `isInterrupted` is asked about every 10 ms; true kills the process. If
/// the importer aborts, the controller's `abort` is called, and its exception passes to the caller.
///
/// **Locale.** The process has the same locale as this one (`setlocale`).
///
/// \param file  the file, which must be a regular one. The process gets it opened for reading
/// \return the verdict, and the object if it is `imported`
/// \throws whatever the process controller throws, after it has killed the process
/// \throws std::bad_alloc  if memory runs out
MZ_COMPONENT_TOOLS_API GuardedImport importGuarded(const std::filesystem::path& file,
                                                   const ImportLimits& limits = {});

} // namespace Mz::Kit
