// SPDX-License-Identifier: BSL-1.0
/// Prints one line about an object, the same on every system.
#pragma once

#include "components/componentManager/cast.h"

#include <cstddef>
#include <string>

namespace Meshes {

/// Writes one line about a mesh or a scene, after `name`, to the standard output.
void describe(const std::string& name, Mz::QrCastable& object);

/// Returns a count with its noun, such as "1 mesh" or "2 meshes".
std::string counted(std::size_t count, const char* one, const char* several);

} // namespace Meshes
