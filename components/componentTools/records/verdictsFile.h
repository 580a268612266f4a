// SPDX-License-Identifier: BSL-1.0
/// Reads and writes the file beside a list: the verdicts of scans, and what the user switched off.
#pragma once

#include "components/componentTools/disabled.h"
#include "components/componentTools/recordedLibrary.h"

#include <filesystem>
#include <optional>
#include <string>

namespace Mz::Tools {

/// Sets the saved verdicts of libraries without builders, and `disabledByUser` for each library
/// that is switched off. Ignores a saved verdict if the library's time or size differs. Ignores a
/// file that is missing or invalid.
void readVerdicts(const std::filesystem::path& file, RecordedLibraries& libraries);

/// Returns what is switched off; `std::nullopt` if there is a file, but it is not valid.
/// \param unreadable  receives whether the system could not read the file, which may be valid; may
///     be null
std::optional<DisabledComponents> readDisabled(const std::filesystem::path& file,
                                               bool* unreadable = nullptr);

/// Returns what `writeVerdicts` wrote as `judgement`; empty if there is none.
std::string readJudgement(const std::filesystem::path& file);

/// Returns whether the record is the component's, by their names.
bool isRecordOf(const RecordedLibrary& library, const DisabledComponent& component);

/// Returns the verdict on a component that is switched off.
Finding disabledFinding(const DisabledComponent& component);

/// Writes the saved verdicts and what is switched off, atomically.
/// \param judgement  what the libraries with builders were compared with (`judgementOf`)
/// \throws whatever `replaceFile` throws
void writeVerdicts(const std::filesystem::path& file, const RecordedLibraries& libraries,
                   const DisabledComponents& disabled, const std::string& judgement = {});

} // namespace Mz::Tools
