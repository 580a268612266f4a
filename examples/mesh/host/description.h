/// What the host says of the objects that it holds, a line for each, the same on every system.
#pragma once

#include "components/componentManager/cast.h"

#include <string>

namespace Meshes {

/// Writes a line about a mesh or a scene to the standard output.
void describe(const std::string& name, Mz::QrCastable& object);

/// "1 mesh", "2 meshes".
std::string counted(std::size_t count, const char* one, const char* several);

} // namespace Meshes
