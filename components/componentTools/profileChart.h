// SPDX-License-Identifier: BSL-1.0
/// Draws a profile of a start as a bar chart.
///
/// \since 0.2
#pragma once

#include "components/componentTools/profile.h"

#include <string>

namespace Mz::Tools {

/// Returns the chart as an SVG document, in UTF-8.
///
/// Each library has a bar, the slowest first, with a colour for each phase. The document is
/// complete in itself: it has no script, and refers to no other file or font. Its colours follow
/// the viewer's preference for light or dark. Of more than 40 libraries, the last bar shows the sum
/// of the rest.
MZ_COMPONENT_TOOLS_API std::string chartOf(const StartProfile& profile);

} // namespace Mz::Tools
