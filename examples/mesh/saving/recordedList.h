/// The component manager's recorded list in a file, so that a start loads only what has changed.
#pragma once

#include <filesystem>

namespace Meshes {

/// Gives the list to the manager, which must not be initialised yet. False when there is no such
/// file. Raises `QrStreamEx` when it is damaged; the manager then reads what is missing afresh.
bool readRecordedList(const std::filesystem::path& file);

/// Writes the initialised manager's list, in place of whatever the file held. Throws what
/// `Mz::replaceFile` throws.
void writeRecordedList(const std::filesystem::path& file);

} // namespace Meshes
