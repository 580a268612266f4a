// SPDX-License-Identifier: BSL-1.0
/// Casts the object to each interface that the host knows, and prints it. Numbers are formatted by
/// `std::to_chars`, so that the output is the same under every locale and on every system.
#include "description.h"

#include "examples/mesh/console/console.h"
#include "examples/mesh/scene.h"

#include <charconv>
#include <iostream>
#include <set>
#include <string_view>

using namespace Mz;

namespace Meshes {

namespace {

/// Writes the fewest digits that are read back as the same number.
void writeNumber(float number) {
    char text[32];
    std::cout << std::string_view(text, std::to_chars(text, text + sizeof text, number).ptr);
}

void writePoint(const Mesh::Point& point) {
    std::cout << '(';
    writeNumber(point.x);
    std::cout << ", ";
    writeNumber(point.y);
    std::cout << ", ";
    writeNumber(point.z);
    std::cout << ')';
}

void writeMesh(const Mesh& mesh) {
    const Mesh::Box box = mesh.bounds();
    std::cout << console::outputText(mesh.formatLabel()) << ", " << mesh.vertexCount()
              << " vertices, " << mesh.faceCount() << " faces, box ";
    writePoint(box.low);
    std::cout << " to ";
    writePoint(box.high);
}

void writeScene(const Scene& scene) {
    std::set<const Mesh*> meshes;
    for (std::size_t index = 0; index < scene.instanceCount(); ++index)
        meshes.insert(scene.instance(index).mesh.get());
    std::cout << "scene, " << counted(scene.instanceCount(), "instance", "instances") << " of "
              << counted(meshes.size(), "mesh", "meshes");
}

} // namespace

void describe(const std::string& name, QrCastable& object) {
    std::cout << name << ": ";
    if (const QrPtr<Mesh> mesh = queryCast<Mesh>(&object))
        writeMesh(*mesh);
    else if (const QrPtr<Scene> scene = queryCast<Scene>(&object))
        writeScene(*scene);
    else
        std::cout << "an object of another kind";
    std::cout << std::endl;
}

std::string counted(std::size_t count, const char* one, const char* several) {
    return std::to_string(count) + ' ' + (count == 1 ? one : several);
}

} // namespace Meshes
