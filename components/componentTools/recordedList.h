/// Reads and writes recorded lists: the component libraries that a host saves between two starts.
///
/// The format is the one that the component manager reads and writes on a `QrBinaryStream` through
/// its `QrPersistant` interface. A host that reads the list before it initialises its manager loads
/// none of the recorded libraries at start, provided that its search path leads to the recorded
/// names and each file has the recorded time and size. Texts are stored in the encoding of the
/// current C locale. Set the locale of the host (usually `setlocale(LC_ALL, "")`) before calling
/// these functions.
#pragma once

#include "components/componentTools/verdict.h"

#include "components/componentManager/uid.h"

#include <cstdint>
#include <filesystem>
#include <iosfwd>
#include <optional>
#include <string>
#include <vector>

namespace Mz::Tools {

/// The record of one builder.
struct RecordedBuilder {
    QrUid uid{};
    std::wstring name, label, text;
    unsigned int number = 0;
    bool flag = false;
    std::int64_t position = -1; ///< its offset in the list file, in bytes; -1 if it was not read
};

/// The record of one file: a component library, or a file without builders.
struct RecordedLibrary {
    std::wstring directory;                ///< normalised as by the manager
    std::wstring fileName;                 ///< normalised as by the manager
    std::uint32_t time = 0;                ///< last modification, in seconds, truncated to 32 bits
    std::int64_t size = 0;                 ///< in bytes
    std::vector<RecordedBuilder> builders; ///< empty if the file is no component or failed
    std::int64_t position = -1; ///< its offset in the list file, in bytes; -1 if it was not read
    /// The saved verdict on a file without builders. It is stored beside the list, not in it.
    std::optional<Finding> kept = std::nullopt;
};

using RecordedLibraries = std::vector<RecordedLibrary>;

/// The result of `readRecordedList`.
struct ListReading {
    enum class State {
        missing,  ///< there is no such file
        good,     ///< the list was read completely
        rejected, ///< damaged, unreadable or not a list: none of it is used
    };
    State state = State::missing;
    std::wstring reason; ///< why it was rejected, with the offset of the fault
    RecordedLibraries libraries;
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
/// even if several processes write it at once.
/// \throws QrStreamEx::ExWriteOpen, QrStreamEx::ExWriteError with the file's name, if the file
///     cannot be written; an old file is then unchanged
MZ_COMPONENT_TOOLS_API void writeRecordedList(const std::filesystem::path& file,
                                              const RecordedLibraries& libraries);

/// Returns the name of the JSON file that stores the verdicts of a list: the list's name with
/// ".verdicts.json" appended.
MZ_COMPONENT_TOOLS_API std::filesystem::path verdictsFileOf(const std::filesystem::path& list);

/// Returns whether a list under the current locale can store the text without loss. A text that
/// contains NUL cannot be stored.
MZ_COMPONENT_TOOLS_API bool isCarried(const std::wstring& text);

/// Returns the record with these normalised names, or null. The list owns it.
MZ_COMPONENT_TOOLS_API const RecordedLibrary* findRecord(const RecordedLibraries& libraries,
                                                         const std::wstring& directory,
                                                         const std::wstring& fileName);

/// Returns a uid as text: four words of eight hexadecimal digits, joined by '-'.
MZ_COMPONENT_TOOLS_API std::wstring textOf(const QrUid& uid);

} // namespace Mz::Tools
