#include "reading/meshObject.h"
#include "sceneObject.h"

#include "components/componentKit/componentKit.h"

using namespace Mz;
using namespace Meshes;

// What is loaded from a stream is made here: the builders bear the uids of the classes.
MZ_COMPONENT(L"Mesh scenes", L"Scenes of meshes, and meshes that were stored",
             Kit::builderOf<MeshObject>(
                 {.uid = storedMeshUid, .name = L"stored mesh", .label = L"Stored mesh"}),
             Kit::builderOf<SceneObject>({.uid = sceneUid, .name = L"scene", .label = L"Scene"}))
