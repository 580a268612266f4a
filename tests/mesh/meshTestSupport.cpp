// SPDX-License-Identifier: BSL-1.0
// Imports test data through the mesh components and checks the meshes.
#include "meshTestSupport.h"

#include "components/componentManager/componentImp.h"

#include <cmath>
#include <filesystem>
#include <fstream>
#include <sstream>

using namespace Mz;

namespace Meshes {

QrPtr<MeshImporter> meshImporter() {
    QrGetComponentManager()->initialize(MZ_BUILD_PATH L"/components/mesh");
    const QrRef<QrCastable> object = QrGetComponentManager()->createObject(meshImporterBuilderUid);
    return QrPtr<MeshImporter>::adopt(safeCast<MeshImporter>(object.get()));
}

Imported importData(std::string_view data, const wchar_t* path) {
    RecordingController controller;
    std::istringstream stream{std::string(data)};
    QrInBuffer buffer(&stream);
    const QrRef<QrCastable> object = meshImporter()->import(&buffer, path, nullptr);
    return {queryCast<Mesh>(object.get()), controller.errors};
}

QrPtr<Mesh> meshOf(std::string_view data, const wchar_t* path) {
    const Imported imported = importData(data, path);
    EXPECT_TRUE(imported.errors.empty());
    EXPECT_TRUE(imported.mesh) << data;
    if (!imported.mesh)
        throw std::runtime_error("there is no mesh");
    expectSound(*imported.mesh);
    return imported.mesh;
}

void expectError(std::string_view data, const wchar_t* path, const std::wstring& error) {
    const Imported imported = importData(data, path);
    EXPECT_FALSE(imported.mesh);
    EXPECT_EQ(imported.errors, std::vector<std::wstring>{error});
}

void expectSound(const Mesh& mesh) {
    for (const Mesh::Point& point : mesh.vertices())
        ASSERT_TRUE(std::isfinite(point.x) && std::isfinite(point.y) && std::isfinite(point.z));
    for (std::size_t index = 0; index < mesh.faceCount(); ++index) {
        ASSERT_GE(mesh.face(index).size(), 3U);
        for (const Mesh::Corner& corner : mesh.face(index)) {
            ASSERT_LT(corner.vertex, mesh.vertexCount());
            ASSERT_TRUE(corner.texCoord == Mesh::absent ||
                        corner.texCoord < mesh.texCoords().size());
            ASSERT_TRUE(corner.normal == Mesh::absent || corner.normal < mesh.normals().size());
        }
    }
}

std::vector<std::uint32_t> faceOf(const Mesh& mesh, std::size_t index) {
    std::vector<std::uint32_t> result;
    for (const Mesh::Corner& corner : mesh.face(index))
        result.push_back(corner.vertex);
    return result;
}

const std::vector<Sample> samples{
    {L"icosahedron.obj", L"Wavefront OBJ", false},
    {L"icosahedronCorners.obj", L"Wavefront OBJ", false},
    {L"icosahedron.off", L"Object File Format (OFF)", true},
    {L"icosahedronAscii.ply", L"Polygon File Format (PLY)", true},
    {L"icosahedronLittle.ply", L"Polygon File Format (PLY)", true},
    {L"icosahedronBig.ply", L"Polygon File Format (PLY)", true},
    {L"icosahedronAscii.stl", L"Stereolithography (STL)", true},
    {L"icosahedronBinary.stl", L"Stereolithography (STL)", true},
    {L"icosahedronSolid.stl", L"Stereolithography (STL)", true},
};

std::wstring samplePath(const std::wstring& name) {
    return MZ_SOURCE_PATH L"/examples/mesh/samples/" + name;
}

std::string contentOf(const std::wstring& path) {
    std::ifstream stream(std::filesystem::path(path), std::ios::binary);
    EXPECT_TRUE(stream.good());
    return {std::istreambuf_iterator<char>(stream), {}};
}

} // namespace Meshes
