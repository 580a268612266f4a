// SPDX-License-Identifier: BSL-1.0
/// The comparisons by subject. Each function adds its lines to the table.
#pragma once

#include "ratioTable.h"

namespace Mz::Benchmarks {

void addCastComparisons(RatioTable& table);
void addCreateComparisons(RatioTable& table);
void addStartComparisons(RatioTable& table);
/// Adds the start with 4,000 recorded libraries.
void addLargeStartComparisons(RatioTable& table);
void addControllerComparisons(RatioTable& table);
void addStreamComparisons(RatioTable& table);
void addMediaComparisons(RatioTable& table);
void addObjectComparisons(RatioTable& table);
void addImportComparisons(RatioTable& table);
void addToolsComparisons(RatioTable& table);
void addScanComparisons(RatioTable& table);

} // namespace Mz::Benchmarks
