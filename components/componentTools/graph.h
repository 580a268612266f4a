/// A picture of component libraries, their builders, and the importers that use them.
#pragma once

#include "components/componentTools/recordedList.h"

#include <filesystem>
#include <set>
#include <string>
#include <utility>
#include <vector>

namespace Mz::Tools {

/// An importer, by the builder that makes it, and the name of the builders that it imports through.
struct GraphImporter {
    QrUid uid{};
    std::wstring builderName;
};

/// The picture in the DOT language, in UTF-8: a box for each library that has builders, in it its
/// builders, and an arrow from each importer to the builders that it imports through. The same
/// input gives the same text.
MZ_COMPONENT_TOOLS_API std::string dotOf(const RecordedLibraries& libraries,
                                         const std::vector<GraphImporter>& importers);

/// Draws such a text with Graphviz as SVG; false, and the reason in `why`, where that is not
/// installed or fails.
MZ_COMPONENT_TOOLS_API bool drawSvg(const std::string& dot, const std::filesystem::path& svg,
                                    std::wstring& why);

} // namespace Mz::Tools
