// SPDX-License-Identifier: BSL-1.0
/// The component that imports PLY files. The format is in `formats/`, the rest of a builder in
/// `MeshImportBuilder`; each format has its own component, so that a host can leave it out.
#include "formats/plyFormat.h"
#include "reading/meshImportBuilder.h"

#include <vector>

using namespace Meshes;

MZ_COMPONENT(L"PLY files", L"Reads meshes from PLY files",
             Mz::Kit::builder<MeshImportBuilder<PlyFormat>>())
