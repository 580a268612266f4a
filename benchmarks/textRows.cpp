// SPDX-License-Identifier: BSL-1.0
// Determines the width of each column first.
#include "textRows.h"

#include <algorithm>
#include <ostream>

namespace Mz::Benchmarks {

void printRows(std::ostream& out, const std::vector<TextRow>& rows, std::size_t textColumns) {
    std::vector<std::size_t> widths(rows.empty() ? 0 : rows.front().size());
    for (const TextRow& row : rows)
        for (std::size_t column = 0; column < row.size(); ++column)
            widths[column] = std::max(widths[column], row[column].size());
    for (const TextRow& row : rows) {
        for (std::size_t column = 0; column < row.size(); ++column) {
            const std::string padding(widths[column] - row[column].size(), ' ');
            const bool figure = column >= textColumns;
            out << (column ? " | " : "| ") << (figure ? padding : "") << row[column]
                << (figure ? "" : padding);
        }
        out << " |\n";
    }
}

} // namespace Mz::Benchmarks
