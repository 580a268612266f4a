// SPDX-License-Identifier: BSL-1.0
// Tests the OBJ format: the statements that are read, those that are skipped, and errors.
#include "meshTestSupport.h"

using namespace Mz;
using namespace Meshes;

namespace {

constexpr const wchar_t* path = L"a.obj";
const std::string square = "v 0 0 0\nv 1 0 0\nv 1 1 0\nv 0 1 0\n";

using Face = std::vector<std::uint32_t>;

void expectCorner(const Mesh::Corner& corner, std::uint32_t vertex, std::uint32_t texCoord,
                  std::uint32_t normal) {
    EXPECT_EQ(corner, (Mesh::Corner{vertex, texCoord, normal}));
}

} // namespace

TEST(ObjFormat, ReadsVerticesAndPolygons) {
    const QrPtr<Mesh> mesh = meshOf(square + "f 1 2 3 4\nf 4 3 1\n", path);
    EXPECT_EQ(mesh->vertexCount(), 4U);
    ASSERT_EQ(mesh->faceCount(), 2U);
    EXPECT_EQ(faceOf(*mesh, 0), (Face{0, 1, 2, 3}));
    EXPECT_EQ(faceOf(*mesh, 1), (Face{3, 2, 0}));
    EXPECT_EQ(mesh->bounds(), (Mesh::Box{{0, 0, 0}, {1, 1, 0}}));
}

TEST(ObjFormat, ReadsAllFormsOfCorners) {
    const QrPtr<Mesh> mesh = meshOf(square + "vt 0.5 0.25\nvt 1\nvt 0 1 0\nvn 0 0 1\nvn 1 0 0\n"
                                             "f 1 2 3\nf 1/1 2/2 3/3\nf 1//1 2//2 3//1\n"
                                             "f 1/3/2 2/1/1 3/2/2\n",
                                    path);
    constexpr std::uint32_t no = Mesh::absent;
    expectCorner(mesh->face(0)[0], 0, no, no);
    expectCorner(mesh->face(1)[2], 2, 2, no);
    expectCorner(mesh->face(2)[1], 1, no, 1);
    expectCorner(mesh->face(3)[0], 0, 2, 1);
    EXPECT_EQ(mesh->texCoords()[0], (Mesh::TexCoord{0.5F, 0.25F}));
    EXPECT_EQ(mesh->texCoords()[1], (Mesh::TexCoord{1, 0}));
    EXPECT_EQ(mesh->normals()[1], (Mesh::Point{1, 0, 0}));
}

TEST(ObjFormat, CountsNegativeIndicesBackFromTheFace) {
    const QrPtr<Mesh> mesh = meshOf("v 0 0 0\nv 1 0 0\nv 0 1 0\nvt 0 0\nvn 0 0 1\n"
                                    "f -3/-1/-1 -2/-1/-1 -1/-1/-1\nv 5 5 5\nvn 0 1 0\n"
                                    "f -1//-1 -2//-2 -4//-1\n",
                                    path);
    expectCorner(mesh->face(0)[0], 0, 0, 0);
    EXPECT_EQ(faceOf(*mesh, 1), (Face{3, 2, 0}));
    EXPECT_EQ(mesh->face(1)[0].normal, 1U);
}

TEST(ObjFormat, ReadsAnyLineEndAndTheFinalLineWithoutOne) {
    for (const std::string end : {"\n", "\r\n", "\r"}) {
        const std::string data =
            "v 0 0 0" + end + "v 1 0 0" + end + end + "v 0 1 0" + end + "f 1 2 3";
        EXPECT_EQ(faceOf(*meshOf(data, path), 0), (Face{0, 1, 2}));
    }
}

TEST(ObjFormat, JoinsContinuedLines) {
    const QrPtr<Mesh> mesh =
        meshOf("v 0 0 0\nv 1 0 \\\n 0\nv 0 1 0\nf 1 2\\\n 3\nf \\\r\n1\\\n\\\n2 3\n"
               "usemtl a \\\nb c\n",
               path);
    ASSERT_EQ(mesh->faceCount(), 2U);
    EXPECT_EQ(faceOf(*mesh, 0), (Face{0, 1, 2}));
    EXPECT_EQ(faceOf(*mesh, 1), (Face{0, 1, 2}));
}

TEST(ObjFormat, EndsACommentWithItsLine) {
    const QrPtr<Mesh> mesh = meshOf("# C:\\temp\\\nv 0 0 0 # the first\nv 1 0 0 #\\\n"
                                    "o name # C:\\\nv 0 1 0\nf 1 2 3 # C:\\\nf 3 2 1\n",
                                    path);
    EXPECT_EQ(mesh->vertexCount(), 3U);
    EXPECT_EQ(mesh->faceCount(), 2U);
}

TEST(ObjFormat, PassesOverWeightsAndColours) {
    const QrPtr<Mesh> mesh =
        meshOf("v 0 0 0 1.0\nv 1 0 0 0.1 0.2 0.3\nv 0 1 0 1 0.1 0.2 0.3\nf 1 2 3\n", path);
    EXPECT_EQ(mesh->vertices()[1], (Mesh::Point{1, 0, 0}));
}

TEST(ObjFormat, PassesOverOtherStatements) {
    const QrPtr<Mesh> mesh = meshOf("mtllib a.mtl b.mtl\no thing\ng one two\ns off\nusemtl red\n" +
                                        square + "p 1 2\nl 1 2 3\nvp 0.5\nf 1 2 3\n",
                                    path);
    EXPECT_EQ(mesh->faceCount(), 1U);
}

TEST(ObjFormat, ReadsNumbersOfAllSpellings) {
    const QrPtr<Mesh> mesh = meshOf("v +1 -.5 2.\nv 1e2 1E-2 +1.5e+1\nv 1e-60 -0 0.1\n", path);
    EXPECT_EQ(mesh->vertices()[0], (Mesh::Point{1, -0.5F, 2}));
    EXPECT_EQ(mesh->vertices()[1], (Mesh::Point{100, 0.01F, 15}));
    EXPECT_EQ(mesh->vertices()[2], (Mesh::Point{0, 0, 0.1F}));
}

TEST(ObjFormat, AllowsFacesBeforeTheirVertices) {
    EXPECT_EQ(faceOf(*meshOf("f 1 2 3\n" + square, path), 0), (Face{0, 1, 2}));
}

TEST(ObjFormat, ReadsAMeshBehindAByteOrderMark) {
    EXPECT_EQ(meshOf("\xEF\xBB\xBF" + square, L"unnamed")->vertexCount(), 4U);
}

TEST(ObjFormat, RefusesBadIndices) {
    expectError(square + "f 1 2 5\nf 1 2 9\nf 1 2 9\n", path,
                L"a.obj: line 6: the face refers to vertex 9, but there are only 4");
    expectError(square + "f 1 2 0\n", path, L"a.obj: line 5: index 0 in '0'; indices begin at 1");
    expectError(square + "f 1 2 -5\n", path,
                L"a.obj: line 5: index -5 reaches back before the first of 4 elements");
    expectError(square + "f 1/1 2/1 3/1\n", path,
                L"a.obj: line 5: the face refers to texture coordinate 1, but there are only 0");
    expectError(square + "vn 0 0 1\nf 1//1 2//1 3//2\n", path,
                L"a.obj: line 6: the face refers to normal 2, but there are only 1");
    expectError(square + "f 1 2 4294967296\n", path,
                L"a.obj: line 5: index 4294967296 is too large");
    expectError(square + "f 1 2 99999999999999999999\n", path,
                L"a.obj: line 5: '99999999999999999999' in '99999999999999999999' is no index");
    for (const char* corner : {"1/", "1//", "/1", "1/1/", "1/1/1/1", "x", "1.5", "--1", "1\\2"})
        EXPECT_FALSE(importData(square + "f 1 2 " + corner + "\n", path).mesh) << corner;
}

TEST(ObjFormat, RefusesFacesOfLessThanThreeCorners) {
    expectError(square + "f 1 2\n", path,
                L"a.obj: line 5: a face needs three corners or more, not 2");
    expectError(square + "f\n", path, L"a.obj: line 5: a face needs three corners or more, not 0");
}

TEST(ObjFormat, RefusesWhatIsNoNumber) {
    expectError("v 0 0 0\nv 1 x 0\n", path, L"a.obj: line 2: 'x' is no number for y");
    expectError("v 0 0\n", path, L"a.obj: line 1: the line ends before z");
    expectError("v 0 0 0\r\nv 0 0 nan\r\n", path, L"a.obj: line 2: 'nan' is no number for z");
    expectError("v 0 0 1e39\n", path, L"a.obj: line 1: '1e39' is no number for z");
    expectError("v 0 0 0 1 1 1 1 1 1\n", path,
                L"a.obj: line 1: '1' is more than this line may have");
    expectError("v 0,5 0 0\n", path, L"a.obj: line 1: '0,5' is no number for x");
    expectError("v 0 0 0\nvt 0 b\n", path, L"a.obj: line 2: 'b' is no number for v");
    expectError("v 0 0 0\nvn 0 0 1 0\n", path,
                L"a.obj: line 2: '0' is more than this line may have");
}

TEST(ObjFormat, RefusesUnknownStatements) {
    expectError("v 0 0 0\nhello world\n", path, L"a.obj: line 2: 'hello' begins no statement");
    expectError("v 0 0 0\n\n\xff\xfe\n", path, L"a.obj: line 3: '?\?' begins no statement");
    expectError(withNuls("v 0 0 0\n\0\0\n"), path, L"a.obj: line 2: '?\?' begins no statement");
    expectError(withNuls("v 0 0 0\nv 0 0 1\0002\n"), path,
                L"a.obj: line 2: '1?2' is no number for z");
}

TEST(ObjFormat, CountsLinesWhateverTheirForm) {
    expectError("v 0 0 0\n# one\n\n v 1\\\n 0 0\r\n\rx\n", path,
                L"a.obj: line 7: 'x' begins no statement");
}
