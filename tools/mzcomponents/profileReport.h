// SPDX-License-Identifier: BSL-1.0
/// The reports of `profile`: text for people, and JSON.
#pragma once

#include "components/componentTools/profile.h"
#include "tools/mzcomponents/output.h"

namespace Mz::Commands {

/// The starts that were measured.
struct MeasuredStarts {
    Tools::StartProfile start;                       ///< with the list, if there is one
    std::optional<Tools::StartProfile> without = {}; ///< without the list, if there is one
};

/// Writes the table, and what is wrong with libraries and folders.
void printProfile(const MeasuredStarts& measured);

/// Returns all of it as JSON. Times are in milliseconds.
Json jsonOf(const MeasuredStarts& measured);

} // namespace Mz::Commands
