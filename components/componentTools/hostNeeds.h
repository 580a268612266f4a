/// Libraries that need their host's own program.
///
/// A host may export functions from its program for its components. Such a component loads in that
/// host alone, and fails in every process that only tries it, so the failure says nothing about it.
#pragma once

#include "components/componentTools/explain.h"
#include "components/componentTools/libraryImage.h"

#include <filesystem>
#include <optional>
#include <vector>

namespace Mz::Tools {

/// The verdict `needsHost` when the library, or one that it needs, names a program among what it
/// needs, as libraries of Windows do; else nothing. Such a library must not be tried: the system
/// would map the program like a library if it found it.
std::optional<Finding> programOfHost(const LibraryImage& image,
                                     const std::vector<Dependency>& dependencies);

/// The verdict `needsHost` when the library at `file`, which could not be loaded, wants a symbol
/// that none of its dependencies defines, as libraries of Linux do; else nothing, also where a
/// dependency cannot be read. A symbol that was forgotten, and is nowhere, looks the same.
std::optional<Finding> symbolOfHost(const std::filesystem::path& file,
                                    const std::vector<Dependency>& dependencies);

} // namespace Mz::Tools
