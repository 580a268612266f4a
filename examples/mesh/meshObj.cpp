#include "formats/objFormat.h"
#include "reading/meshImportBuilder.h"

using namespace Meshes;

MZ_COMPONENT(L"Wavefront OBJ files", L"Reads meshes from Wavefront OBJ files",
             Mz::Kit::builder<MeshImportBuilder<ObjFormat>>())
