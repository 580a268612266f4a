#include "formats/stlFormat.h"
#include "reading/meshImportBuilder.h"

using namespace Meshes;

MZ_COMPONENT(L"STL files", L"Reads meshes from STL files",
             Mz::Kit::builder<MeshImportBuilder<StlFormat>>())
