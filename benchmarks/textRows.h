// SPDX-License-Identifier: BSL-1.0
/// Prints tables as Markdown, with columns of equal width.
#pragma once

#include <cstddef>
#include <iosfwd>
#include <string>
#include <vector>

namespace Mz::Benchmarks {

using TextRow = std::vector<std::string>;

/// Prints the rows, which have as many cells as the first one. Texts are left-aligned, figures
/// right-aligned.
///
/// \param textColumns  the number of columns at the left that are texts; the others are figures
void printRows(std::ostream& out, const std::vector<TextRow>& rows, std::size_t textColumns);

} // namespace Mz::Benchmarks
