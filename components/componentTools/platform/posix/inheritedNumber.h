// SPDX-License-Identifier: BSL-1.0
/// The descriptor of the open file that a child inherits.
#pragma once

#include <unistd.h>

namespace Mz::Tools::System {

inline constexpr int inheritedNumber = STDERR_FILENO + 1;

} // namespace Mz::Tools::System
