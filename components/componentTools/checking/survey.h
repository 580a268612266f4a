// SPDX-License-Identifier: BSL-1.0
/// Everything that a library answers, for the comparison of processes with different surroundings.
#pragma once

#include "components/componentTools/checking/checkContext.h"

namespace Mz::Tools {

/// Sets the surroundings of the task in this process. Call it before the library is loaded.
void enterSurroundings(const CheckTask& task);

/// Sends the answers of the library: its description, what its builders make, what its objects
/// write, and which inputs its import builders accept. Calls that ended an earlier process are
/// skipped.
void survey(CheckContext& context);

} // namespace Mz::Tools
