// SPDX-License-Identifier: BSL-1.0
/// Examines a file without running any of its code.
#pragma once

#include "components/componentTools/dependency.h"
#include "components/componentTools/images/libraryImage.h"
#include "components/componentTools/verdict.h"

#include <filesystem>
#include <optional>
#include <vector>

namespace Mz::Tools {

/// Returns the verdict on a file from its path, attributes and content. Ignores its dependencies.
/// \param image  receives the file's content if the file is a candidate; else it is unchanged
Finding inspectFile(const std::filesystem::path& file, LibraryImage& image);

/// Returns why the status of a file could not be queried: `unreachable` if access is denied,
/// `missing` if there is no such file, else `unreadable`.
Verdict verdictOnAbsence(const std::filesystem::path& file);

/// Returns the direct and indirect dependencies of a file, each name once, in the loader's order.
/// \param image          the image of `file`
/// \param programFolder  the folder of the host's program (Windows); may be empty
std::vector<Dependency> dependenciesOf(const std::filesystem::path& file, const LibraryImage& image,
                                       const std::filesystem::path& programFolder);

/// Returns the verdict `dependencyMissing` for the first dependency that was not found;
/// `std::nullopt` if all were found.
std::optional<Finding> missingDependency(const std::filesystem::path& file,
                                         const std::vector<Dependency>& dependencies);

} // namespace Mz::Tools
