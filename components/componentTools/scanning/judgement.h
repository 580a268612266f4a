// SPDX-License-Identifier: BSL-1.0
/// Tells whether the libraries of a list were compared with this host before.
#pragma once

#include "components/componentTools/recordedLibrary.h"

#include <filesystem>
#include <string>
#include <vector>

namespace Mz::Tools {

/// Returns a digest of what a scan compared: the files of the libraries that have builders, and the
/// host. Equal digests mean that a scan would find again that the libraries fit.
/// \param hosts  the programs and libraries of the host, in addition to those of this process
/// \return the digest; empty, which equals none, if a file of the host cannot be queried
std::string judgementOf(const RecordedLibraries& libraries,
                        const std::vector<std::filesystem::path>& hosts);

} // namespace Mz::Tools
