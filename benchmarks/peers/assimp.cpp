// SPDX-License-Identifier: BSL-1.0
// Open Asset Import Library: one importer that is kept, without steps after the import.
#include "peers/registration.h"
#include "sphere.h"

#include <assimp/Importer.hpp>
#include <assimp/scene.h>

namespace Mz::Benchmarks {

namespace {

void import(benchmark::State& state) {
    Assimp::Importer importer;
    std::size_t faces = 0;
    for (auto iteration : state) {
        static_cast<void>(iteration);
        const aiScene* const scene = importer.ReadFile(sphereFile(), 0);
        faces = scene && scene->mNumMeshes == 1 ? scene->mMeshes[0]->mNumFaces : 0;
    }
    if (faces != sphereFaces)
        state.SkipWithError("the mesh was not imported");
}

void addPeer(RatioTable& table) {
    table.addPeer("import/obj", "assimp", import);
}

const PeerRegistration registration(addPeer);

} // namespace

} // namespace Mz::Benchmarks
