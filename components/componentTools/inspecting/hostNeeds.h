// SPDX-License-Identifier: BSL-1.0
/// Detects libraries that need the program of their host.
///
/// A host may export functions from its program for its components. Such a component can be loaded
/// by that host only. It fails in a probe, and that failure is no fault of the component.
#pragma once

#include "components/componentTools/dependency.h"
#include "components/componentTools/images/libraryImage.h"
#include "components/componentTools/verdict.h"

#include <filesystem>
#include <optional>
#include <vector>

namespace Mz::Tools {

/// Returns the verdict `needsHost` if a Windows library, or one of its dependencies, imports from a
/// program; else `std::nullopt`. Such a library must not be loaded: the system would map the
/// program like a library.
std::optional<Finding> programOfHost(const LibraryImage& image,
                                     const std::vector<Dependency>& dependencies);

/// Returns the verdict `needsHost` if the Linux library at `file`, which failed to load, needs a
/// symbol that none of its dependencies defines; else, or if a dependency cannot be read,
/// `std::nullopt`. A symbol that was forgotten, and that no host defines, looks the same.
std::optional<Finding> symbolOfHost(const std::filesystem::path& file,
                                    const std::vector<Dependency>& dependencies);

} // namespace Mz::Tools
