// SPDX-License-Identifier: BSL-1.0
/// The component that imports STL files. The format is in `formats/`, the rest of a builder in
/// `MeshImportBuilder`; each format has its own component, so that a host can leave it out.
#include "formats/stlFormat.h"
#include "reading/meshImportBuilder.h"

#include <vector>

using namespace Meshes;

MZ_COMPONENT(L"STL files", L"Reads meshes from STL files",
             Mz::Kit::builder<MeshImportBuilder<StlFormat>>())
