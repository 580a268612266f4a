#include "formats/offFormat.h"
#include "reading/meshImportBuilder.h"

using namespace Meshes;

MZ_COMPONENT(L"OFF files", L"Reads meshes from OFF files",
             Mz::Kit::builder<MeshImportBuilder<OffFormat>>())
