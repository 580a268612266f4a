// SPDX-License-Identifier: BSL-1.0
/// Names the faults of Windows programs.
#pragma once

#include <string>

namespace Mz::Tools::System {

/// Returns the name of the fault with that code, for people.
std::wstring faultName(unsigned long code);

} // namespace Mz::Tools::System
