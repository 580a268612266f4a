// SPDX-License-Identifier: BSL-1.0
/// Reads and writes recorded lists: the component libraries that a host saves between two starts.
///
/// The format is the one that the component manager reads and writes on a `QrBinaryStream` through
/// its `QrPersistant` interface. A host that reads the list before it initialises its manager loads
/// none of the recorded libraries at start, provided that its search path leads to the recorded
/// names and each file has the recorded time and size. Texts are stored in the encoding of the
/// current C locale. Set the locale of the host (usually `setlocale(LC_ALL, "")`) before calling
/// these functions.
#pragma once

#include "components/componentTools/export.h"
#include "components/componentTools/recordedLibrary.h"

#include <filesystem>
#include <iosfwd>
#include <string>

namespace Mz::Tools {

/// The result of `readRecordedList`.
struct ListReading {
    /// What became of the file.
    enum class State {
        missing,  ///< there is no such file
        good,     ///< the list was read completely
        rejected, ///< damaged, unreadable or not a list: none of it is used
    };
    State state = State::missing; ///< what became of the file
    std::wstring reason;          ///< why it was rejected, with the offset of the fault
    RecordedLibraries libraries;  ///< empty unless the list is good
};

/// Reads a list and the verdicts beside it.
///
/// The whole file must be valid, to the last byte, or the list is rejected as a whole. Memory use
/// is bounded by the size of the file.
/// \throws std::bad_alloc only; a bad file is reported by `ListReading::state`
MZ_COMPONENT_TOOLS_API ListReading readRecordedList(const std::filesystem::path& file);

/// Writes a list to a stream, in the format that the component manager reads.
/// \throws QrStreamEx::ExWriteError if the stream fails
MZ_COMPONENT_TOOLS_API void writeRecordedList(std::ostream& stream,
                                              const RecordedLibraries& libraries);

/// Writes a list to a file, atomically: readers see the complete old file or the complete new one,
/// even if several processes write it at once. A file that already has this content is not
/// replaced. \throws QrStreamEx::ExWriteOpen, QrStreamEx::ExWriteError with the file's name, if the
/// file
///     cannot be written; an old file is then unchanged
MZ_COMPONENT_TOOLS_API void writeRecordedList(const std::filesystem::path& file,
                                              const RecordedLibraries& libraries);

/// Returns the name of the JSON file that stores the verdicts of a list: the list's name with
/// ".verdicts.json" appended.
MZ_COMPONENT_TOOLS_API std::filesystem::path verdictsFileOf(const std::filesystem::path& list);

/// Returns whether a list under the current locale can store the text without loss. A text that
/// contains NUL cannot be stored.
MZ_COMPONENT_TOOLS_API bool isCarried(const std::wstring& text);

} // namespace Mz::Tools
