// SPDX-License-Identifier: BSL-1.0
/// Counts what the program allocates.
#pragma once

#include <cstddef>

namespace Meshes {

/// All bytes that this program's own code has asked for so far, whether it gave them back or not.
std::size_t allocatedBytes();

} // namespace Meshes
