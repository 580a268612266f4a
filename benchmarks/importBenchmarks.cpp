// SPDX-License-Identifier: BSL-1.0
// Importing a Wavefront OBJ file through the example's components, compared with a reader that
// knows that the file contains nothing but vertices and quadrangles.
#include "comparisons.h"
#include "manager.h"
#include "sphere.h"

#include "components/componentKit/importer.h"
#include "examples/mesh/mesh.h"

#include <algorithm>
#include <array>
#include <charconv>
#include <cstdint>
#include <fstream>
#include <string>
#include <string_view>
#include <vector>

namespace Mz::Benchmarks {

namespace {

void importThroughManager(benchmark::State& state) {
    initializedManager();
    const auto importer = Kit::newImporter<L"mesh">();
    const std::wstring name(sphereFile().begin(), sphereFile().end());
    std::size_t faces = 0;
    for (auto iteration : state) {
        static_cast<void>(iteration);
        bool found = false;
        const QrRef<QrCastable> object = importer->import(name.c_str(), nullptr, found);
        const auto mesh = queryCast<Meshes::Mesh>(object.get());
        faces = mesh && mesh->vertexCount() == sphereVertices ? mesh->faceCount() : 0;
    }
    if (faces != sphereFaces)
        state.SkipWithError("the mesh was not imported");
}

struct PlainMesh {
    std::vector<std::array<float, 3>> vertices;
    std::vector<std::array<std::uint32_t, 4>> faces;
};

template <class Values>
void parseLine(const char* at, const char* end, Values& values) {
    for (auto& value : values) {
        while (at != end && *at == ' ')
            ++at;
        at = std::from_chars(at, end, value).ptr;
    }
}

PlainMesh parse(std::string_view text) {
    PlainMesh mesh;
    while (!text.empty()) {
        const std::size_t length = std::min(text.find('\n'), text.size());
        const char* const line = text.data();
        if (text.starts_with("v "))
            parseLine(line + 2, line + length, mesh.vertices.emplace_back());
        else if (text.starts_with("f "))
            parseLine(line + 2, line + length, mesh.faces.emplace_back());
        text.remove_prefix(std::min(length + 1, text.size()));
    }
    return mesh;
}

void importByHand(benchmark::State& state) {
    std::size_t faces = 0;
    for (auto iteration : state) {
        static_cast<void>(iteration);
        std::ifstream file(sphereFile(), std::ios::binary | std::ios::ate);
        std::string content(static_cast<std::size_t>(file.tellg()), '\0');
        file.seekg(0).read(content.data(), static_cast<std::streamsize>(content.size()));
        const PlainMesh mesh = parse(content);
        faces = mesh.vertices.size() == sphereVertices ? mesh.faces.size() : 0;
    }
    if (faces != sphereFaces)
        state.SkipWithError("the mesh was not read");
}

} // namespace

void addImportComparisons(RatioTable& table) {
    table.add({.name = "import/obj",
               .work = "import of an OBJ file of 330 KB",
               .limit = "one read, from_chars of each number"},
              importThroughManager, importByHand);
}

} // namespace Mz::Benchmarks
