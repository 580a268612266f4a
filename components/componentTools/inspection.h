/// Judging a file from the outside.
#pragma once

#include "components/componentTools/explain.h"
#include "components/componentTools/libraryImage.h"

namespace Mz::Tools {

/// The verdict on the file by its place, its attributes and its bytes; `image` is filled in where
/// it could be read. Dependencies are not looked at.
Finding inspectFile(const std::filesystem::path& file, LibraryImage& image);

/// Why the status of a file cannot be queried: `unreachable`, else `missing`.
Verdict verdictOnAbsence(const std::filesystem::path& file);

/// Every library that is needed by the file whose image this is, each once.
std::vector<Dependency> dependenciesOf(const std::filesystem::path& file, const LibraryImage& image,
                                       const std::filesystem::path& programFolder);

/// The verdict `dependencyMissing` when one is, else nothing.
std::optional<Finding> missingDependency(const std::filesystem::path& file,
                                         const std::vector<Dependency>& dependencies);

} // namespace Mz::Tools
