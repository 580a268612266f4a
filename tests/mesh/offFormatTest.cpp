// SPDX-License-Identifier: BSL-1.0
// Tests the OFF format: the forms that are read, and errors.
#include "meshTestSupport.h"

using namespace Mz;
using namespace Meshes;

namespace {

constexpr const wchar_t* path = L"a.off";
const std::string points = "0 0 0\n1 0 0\n1 1 0\n0 1 0\n";

using Face = std::vector<std::uint32_t>;

} // namespace

TEST(OffFormat, ReadsVerticesAndPolygons) {
    const QrPtr<Mesh> mesh = meshOf("OFF\n4 2 0\n" + points + "4 0 1 2 3\n3 3 2 0\n", path);
    EXPECT_EQ(mesh->vertexCount(), 4U);
    EXPECT_EQ(faceOf(*mesh, 0), (Face{0, 1, 2, 3}));
    EXPECT_EQ(faceOf(*mesh, 1), (Face{3, 2, 0}));
}

TEST(OffFormat, ReadsCountsOnTheHeadersLineAndComments) {
    const QrPtr<Mesh> mesh = meshOf("# made by hand\n\nOFF 4 1 # no edges\n# points\n" + points +
                                        "# faces\r\n\r\n3 0 1 2 # the only one\r\n# end",
                                    L"unnamed");
    EXPECT_EQ(mesh->faceCount(), 1U);
}

TEST(OffFormat, PassesOverColours) {
    const QrPtr<Mesh> mesh = meshOf("COFF\n3 4 0\n0 0 0 255 0 0 255\n1 0 0 0.5 0.5 0.5\n0 1 0\n"
                                    "3 0 1 2 255 0 0\n3 0 1 2 0.1 0.2 0.3 1\n3 0 1 2 7\n3 0 1 2\n",
                                    path);
    EXPECT_EQ(mesh->vertexCount(), 3U);
    EXPECT_EQ(mesh->faceCount(), 4U);
}

TEST(OffFormat, ReadsNormalsAndTextureCoordinates) {
    const QrPtr<Mesh> mesh = meshOf("STCNOFF 3 1 0\n0 0 0 0 0 1 9 9 9 9 0 0.5\n"
                                    "1 0 0 0 1 0 9 9 9 9 1 0\n0 1 0 1 0 0 9 9 9 9 1 1\n3 0 1 2\n",
                                    path);
    EXPECT_EQ(mesh->normals()[1], (Mesh::Point{0, 1, 0}));
    EXPECT_EQ(mesh->texCoords()[0], (Mesh::TexCoord{0, 0.5F}));
    EXPECT_EQ(mesh->face(0)[2], (Mesh::Corner{2, 2, 2}));
    EXPECT_EQ(meshOf("NOFF 1 0 0\n1 2 3 0 0 1\n", path)->normals().size(), 1U);
}

TEST(OffFormat, ReadsAMeshWithoutAnything) {
    const QrPtr<Mesh> mesh = meshOf("OFF\n0 0 0\n", path);
    EXPECT_EQ(mesh->vertexCount(), 0U);
    EXPECT_EQ(mesh->bounds(), (Mesh::Box{}));
}

TEST(OffFormat, RefusesFormsThatItDoesNotRead) {
    expectError("OFF BINARY\n1234", path, L"a.off: line 1: the binary form is not supported");
    expectError("4OFF\n0 0 0\n", path,
                L"a.off: line 1: '4OFF' has no points of three dimensions, and is not supported");
    expectError("nOFF 5\n0 0 0\n", L"unnamed",
                L"unnamed: line 1: 'nOFF' has no points of three dimensions, and is not supported");
}

TEST(OffFormat, RefusesBadIndicesAndCounts) {
    expectError("OFF\n4 1 0\n" + points + "3 0 1 4\n", path,
                L"a.off: line 7: the face refers to vertex 4, but there are only 4");
    expectError("OFF\n4 1 0\n" + points + "3 0 1 -1\n", path,
                L"a.off: line 7: '-1' is no number for a vertex");
    expectError("OFF\n4 1 0\n" + points + "3 0 1\n", path,
                L"a.off: line 7: the line ends before a vertex");
    expectError("OFF\n4 1 0\n" + points + "2 0 1\n", path,
                L"a.off: line 7: a face needs three corners or more, not 2");
    expectError("OFF\n4 1 0\n" + points + "4294967295 0 1 2\n", path,
                L"a.off: line 7: the line ends before a vertex");
    expectError("OFF\n4 1 0\n" + points + "3 0 1 4294967295\n", path,
                L"a.off: line 7: index 4294967295 is too large");
    expectError("OFF\n4 x 0\n", path, L"a.off: line 2: 'x' is no number for the number of faces");
    expectError("OFF\n", path, L"a.off: line 1: the file ends before its counts");
    expectError("OFF\n-1 0 0\n", path, L"a.off: line 2: '-1' is no number of vertices");
    expectError("OFF\n4294967296 0 0\n", path,
                L"a.off: line 2: '4294967296' is no number of vertices");
}

TEST(OffFormat, RefusesMoreOrLessDataThanCounted) {
    expectError("OFF\n4294967295 4294967295 0\n" + points, path,
                L"a.off: line 6: the file ends after 4 of 4294967295 vertices");
    expectError("OFF\n4 2 0\n" + points + "3 0 1 2\n", path,
                L"a.off: line 7: the file ends after 1 of 2 faces");
    expectError("OFF\n4 0 0\n" + points + "3 0 1 2\n", path,
                L"a.off: line 7: '3' stands behind the last face");
    expectError("OFF\n1 0 0\n0 0 0 1 1 1 1 1\n", path,
                L"a.off: line 3: '1' is more than this line may have");
    expectError("OFF\n1 0 0\n0 nil 0\n", path, L"a.off: line 3: 'nil' is no number for y");
    expectError(withNuls("OFF\n1 0 0\n0 0 0\n\0"), path,
                L"a.off: line 4: '?' stands behind the last face");
}
