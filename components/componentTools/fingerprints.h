// SPDX-License-Identifier: BSL-1.0
/// The interfaces that a library or program describes by `MZ_INTERFACE` (`fingerprint.h`).
///
/// \since 0.2
#pragma once

#include "components/componentTools/export.h"

#include <filesystem>
#include <string>
#include <vector>

namespace Mz::Tools {

/// Returns the names of the interfaces whose fingerprints are in the file, without their
/// namespaces, each once, sorted. Runs no code of the file.
///
/// \return empty if the file has no fingerprint, is no library or program, or cannot be read
/// \throws std::bad_alloc only
MZ_COMPONENT_TOOLS_API std::vector<std::string> fingerprintsOf(const std::filesystem::path& file);

} // namespace Mz::Tools
