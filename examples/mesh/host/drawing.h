// SPDX-License-Identifier: BSL-1.0
/// Pictures of meshes.
#pragma once

#include "examples/mesh/mesh.h"

#include <filesystem>

namespace Meshes {

/// Draws the mesh as an SVG file: seen from above at an angle, the nearest faces last, each shaded
/// by its slope. The same mesh gives the same bytes on every system. Of a mesh with very many faces
/// only the nearest are drawn.
///
/// \throws QrStreamEx::ExWriteOpen, ExWriteError if the file cannot be written
void draw(const Mesh& mesh, const std::filesystem::path& file);

} // namespace Meshes
