// SPDX-License-Identifier: BSL-1.0
/// Counts the memory that the program allocates.
#pragma once

#include <cstddef>

namespace Meshes {

/// Returns the number of bytes that this program's own code has allocated so far, freed or not.
std::size_t allocatedBytes();

} // namespace Meshes
