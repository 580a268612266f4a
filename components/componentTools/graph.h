// SPDX-License-Identifier: BSL-1.0
/// Draws a graph of component libraries, their builders, and the importers that use them.
#pragma once

#include "components/componentTools/recordedList.h"

#include <filesystem>
#include <set>
#include <string>
#include <utility>
#include <vector>

namespace Mz::Tools {

/// An importer and the import builders that it uses.
struct GraphImporter {
    QrUid uid{};              ///< of the builder that makes the importer
    std::wstring builderName; ///< the name of the builders through which it imports
};

/// Returns the graph in the DOT language, in UTF-8.
///
/// Each library that has builders is a box that contains them. An arrow leads from each importer to
/// each builder through which it imports. Equal input results in equal text.
MZ_COMPONENT_TOOLS_API std::string dotOf(const RecordedLibraries& libraries,
                                         const std::vector<GraphImporter>& importers);

/// Draws a DOT text as SVG with Graphviz.
/// \param dot  the text, in UTF-8
/// \param svg  the file to write; an existing file is replaced
/// \param why  receives the reason if the result is false
/// \return false if Graphviz is not installed or fails
/// \throws QrStreamEx::ExWriteOpen, QrStreamEx::ExWriteError if `svg` or a temporary file beside it
///     cannot be written
MZ_COMPONENT_TOOLS_API bool drawSvg(const std::string& dot, const std::filesystem::path& svg,
                                    std::wstring& why);

} // namespace Mz::Tools
