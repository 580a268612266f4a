// SPDX-License-Identifier: BSL-1.0
// tinyobjloader: its ObjReader, which its documentation recommends. It keeps quadrangles, as the
// example does.
#include "peers/registration.h"
#include "sphere.h"

#include <tiny_obj_loader.h>

namespace Mz::Benchmarks {

namespace {

void import(benchmark::State& state) {
    tinyobj::ObjReaderConfig config;
    config.triangulate = false;
    std::size_t faces = 0;
    for (auto iteration : state) {
        static_cast<void>(iteration);
        tinyobj::ObjReader reader;
        const bool isRead = reader.ParseFromFile(sphereFile(), config) &&
                            reader.GetAttrib().vertices.size() == 3 * sphereVertices;
        faces = isRead ? reader.GetShapes().at(0).mesh.num_face_vertices.size() : 0;
    }
    if (faces != sphereFaces)
        state.SkipWithError("the mesh was not imported");
}

void addPeer(RatioTable& table) {
    table.addPeer("import/obj", "tinyobjloader", import);
}

const PeerRegistration registration(addPeer);

} // namespace

} // namespace Mz::Benchmarks
