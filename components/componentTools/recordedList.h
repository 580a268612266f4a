/// The list of component libraries that a host keeps between two starts, as a file of its own.
///
/// It is the list that the component manager's persistent companion reads and writes on a
/// `QrBinaryStream`: a host that reads it before it initialises its manager loads none of the
/// libraries in it at start, as long as its search path leads to the recorded names and each file
/// has its recorded time and size. Texts stand in it in the encoding of the current C locale, so
/// set the locale that the host has (`setlocale(LC_ALL, "")` as a rule) before using it.
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

struct RecordedBuilder {
    QrUid uid{};
    std::wstring name, label, text;
    unsigned int number = 0;
    bool flag = false;
    std::int64_t position = -1; ///< where it begins in the file it was read from, in bytes
};

struct RecordedLibrary {
    std::wstring directory;                ///< normalised, as the manager does
    std::wstring fileName;                 ///< likewise
    std::uint32_t time = 0;                ///< of the last modification, in seconds, cut to 32 bits
    std::int64_t size = 0;                 ///< in bytes
    std::vector<RecordedBuilder> builders; ///< none for a file that is no component or failed
    std::int64_t position = -1;
    /// Why it has no builders, when a scan has kept that beside the list; no part of the list.
    std::optional<Finding> kept = std::nullopt;
};

using RecordedLibraries = std::vector<RecordedLibrary>;

/// What was read from a file that should hold a list.
struct ListReading {
    enum class State {
        missing, ///< there is no such file
        good,
        rejected, ///< damaged, or something else: nothing of it is used
    };
    State state = State::missing;
    std::wstring reason; ///< why it was rejected, with the position
    RecordedLibraries libraries;
};

/// Reads a list. Everything must make sense, to the last byte, or the whole is rejected; memory is
/// bounded by the file's own size. Never throws but for lack of memory.
MZ_COMPONENT_TOOLS_API ListReading readRecordedList(const std::filesystem::path& file);

/// Writes a list to a stream, from where a manager's companion reads it. Throws
/// `QrStreamEx::ExWriteError`.
MZ_COMPONENT_TOOLS_API void writeRecordedList(std::ostream& stream,
                                              const RecordedLibraries& libraries);

/// Writes a list in one step: others see the old file or the new one, whole, whoever else writes
/// it at the same time. Throws `QrStreamEx::ExWriteOpen` or `ExWriteError` with the file's name;
/// the old file then stays.
MZ_COMPONENT_TOOLS_API void writeRecordedList(const std::filesystem::path& file,
                                              const RecordedLibraries& libraries);

/// The file that keeps the verdicts of a list, as JSON, beside it.
MZ_COMPONENT_TOOLS_API std::filesystem::path verdictsFileOf(const std::filesystem::path& list);

/// Whether the current locale carries the text through a list unchanged.
MZ_COMPONENT_TOOLS_API bool isCarried(const std::wstring& text);

/// The record with these names, or null.
MZ_COMPONENT_TOOLS_API const RecordedLibrary* findRecord(const RecordedLibraries& libraries,
                                                         const std::wstring& directory,
                                                         const std::wstring& fileName);

/// An identifier as people write it: four words in hexadecimal, joined by '-'.
MZ_COMPONENT_TOOLS_API std::wstring textOf(const QrUid& uid);

} // namespace Mz::Tools
