#include "formats/plyFormat.h"
#include "reading/meshImportBuilder.h"

using namespace Meshes;

MZ_COMPONENT(L"PLY files", L"Reads meshes from PLY files",
             Mz::Kit::builder<MeshImportBuilder<PlyFormat>>())
