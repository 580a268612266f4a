// SPDX-License-Identifier: BSL-1.0
/// The component that makes scenes and stored meshes. Objects that are loaded from a stream are
/// made here: each builder has the uid of the class, by which the object IO finds it. Import
/// builders cannot do that, since they need a file.
#include "reading/meshObject.h"
#include "sceneObject.h"

#include "components/componentKit/componentKit.h"

using namespace Mz;
using namespace Meshes;

MZ_COMPONENT(L"Mesh scenes", L"Scenes of meshes, and meshes that were stored",
             Kit::builderOf<MeshObject>(
                 {.uid = storedMeshUid, .name = L"stored mesh", .label = L"Stored mesh"}),
             Kit::builderOf<SceneObject>({.uid = sceneUid, .name = L"scene", .label = L"Scene"}))
