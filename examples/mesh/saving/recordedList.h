// SPDX-License-Identifier: BSL-1.0
/// The recorded list of the component manager in a file, so that a start loads only what has
/// changed.
#pragma once

#include <filesystem>

namespace Meshes {

/// Reads the list into the manager, which must not be initialised yet.
///
/// \return false if the file cannot be opened
/// \throws QrStreamEx if the list is damaged; `initialize` then loads the libraries that were not
/// read
bool readRecordedList(const std::filesystem::path& file);

/// Replaces the content of the file by the list of the initialised manager.
///
/// \throws QrStreamEx as `Mz::replaceFile` does, and `ExWriteError` if the locale cannot carry one
///     of the texts; the old file is then unchanged
void writeRecordedList(const std::filesystem::path& file);

} // namespace Meshes
