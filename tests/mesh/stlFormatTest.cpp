// SPDX-License-Identifier: BSL-1.0
// Tests the STL format in text and in binary: how points are merged, and errors.
#include "meshTestSupport.h"

#include <bit>

using namespace Mz;
using namespace Meshes;

namespace {

constexpr const wchar_t* path = L"a.stl";

using Face = std::vector<std::uint32_t>;

std::string facet(const std::string& a, const std::string& b, const std::string& c) {
    return "facet normal 0 0 1\nouter loop\nvertex " + a + "\nvertex " + b + "\nvertex " + c +
           "\nendloop\nendfacet\n";
}

const std::string triangle = facet("0 0 0", "1 0 0", "0 1 0");

void append(std::string& data, std::uint32_t number) {
    for (int shift = 0; shift < 32; shift += 8)
        data.push_back(static_cast<char>(number >> shift));
}

/// Returns a binary file with that many equal facets, whose header states `count`.
std::string binary(std::size_t facets, std::uint32_t count, const std::string& title = "solid",
                   float last = 1) {
    std::string data = title;
    data.resize(80);
    append(data, count);
    for (std::size_t facet = 0; facet < facets; ++facet) {
        for (const float number :
             {0.0F, 0.0F, 1.0F, 0.0F, 0.0F, 0.0F, 1.0F, 0.0F, 0.0F, 0.0F, last, 0.0F})
            append(data, std::bit_cast<std::uint32_t>(number));
        data.append(2, '\0');
    }
    return data;
}

} // namespace

TEST(StlFormat, WeldsPointsInTheOrderOfTheirFirstUse) {
    const QrPtr<Mesh> mesh =
        meshOf("solid name of it\n" + triangle + facet("0 1 0", "1 0 0", "1 1 -0.0") +
                   facet("1 1 0", "0 0 0", "-0 1 0") + "endsolid\n",
               path);
    ASSERT_EQ(mesh->vertexCount(), 4U);
    EXPECT_EQ(mesh->vertices()[3], (Mesh::Point{1, 1, 0}));
    EXPECT_EQ(faceOf(*mesh, 1), (Face{2, 1, 3}));
    EXPECT_EQ(faceOf(*mesh, 2), (Face{3, 0, 2}));
}

TEST(StlFormat, ReadsTextOfAnyCaseAndSeveralSolids) {
    const QrPtr<Mesh> mesh = meshOf("SOLID a\r\nFACET NORMAL nan -nan inf\r\n OUTER LOOP\r\n"
                                    "Vertex 0 0 0\r\n\tVERTEX 1 0 0\r\nVERTEX 0 1 0\r\nENDLOOP\r\n"
                                    "ENDFACET\r\nENDSOLID a\r\nsolid b\n" +
                                        triangle + "endsolid b\n",
                                    L"unnamed");
    EXPECT_EQ(mesh->faceCount(), 2U);
    EXPECT_EQ(mesh->vertexCount(), 3U);
}

TEST(StlFormat, ReadsBinaryThatBeginsWithSolid) {
    const QrPtr<Mesh> mesh = meshOf(binary(2, 2, "solid facet normal 0 0 1"), L"unnamed");
    EXPECT_EQ(mesh->faceCount(), 2U);
    EXPECT_EQ(mesh->vertexCount(), 3U);
    EXPECT_EQ(meshOf(binary(1, 1, std::string(80, ' ')), L"unnamed")->faceCount(), 1U);
    EXPECT_EQ(meshOf(binary(0, 0), L"unnamed")->faceCount(), 0U);
}

TEST(StlFormat, RefusesABinaryFileOfAnotherSizeThanCounted) {
    expectError(binary(2, 3), path,
                L"a.stl: byte 80: 3 facets would make a file of 234 bytes, but it has 184");
    expectError(binary(2, 1), path,
                L"a.stl: byte 80: 1 facets would make a file of 134 bytes, but it has 184");
    expectError(binary(1, 4294967295U), path,
                L"a.stl: byte 80: 4294967295 facets would make a file of 214748364834 bytes, "
                L"but it has 134");
    expectError(binary(0, 0).substr(0, 83), path,
                L"a.stl: byte 0: the file ends inside its header of 84 bytes");
    const Imported unnamed = importData(binary(2, 3), L"unnamed");
    EXPECT_FALSE(unnamed.mesh);
    EXPECT_TRUE(unnamed.errors.empty());
}

TEST(StlFormat, RefusesCoordinatesThatAreNotFinite) {
    for (const std::uint32_t bits : {0x7F800000U, 0xFF800000U, 0x7FC00000U})
        expectError(binary(1, 1, "x", std::bit_cast<float>(bits)), path,
                    L"a.stl: byte 120: a coordinate is not finite");
}

TEST(StlFormat, RefusesTextThatLacksAStatement) {
    expectError("solid\n" + triangle, path, L"a.stl: line 8: the file ends without 'endsolid'");
    expectError("solid\nfacet normal 0 0\n", path,
                L"a.stl: line 2: the line ends inside the normal");
    expectError("solid\nfacet normal 0 0 up\n", path,
                L"a.stl: line 2: 'up' is no number for the normal");
    expectError("solid\nfacet\n", path, L"a.stl: line 2: the line lacks the word 'normal'");
    expectError("solid\nfacet normal 0 0 1\nouter loop\nvertex 0 0 0\nvertex 0 0 1\nendloop\n",
                path, L"a.stl: line 6: 'vertex' is missing before 'endloop'");
    expectError("solid\nfacet normal 0 0 1\nouter loop\nvertex 0 0 0\nvertex 0 0 1\nvertex 1 0 0\n"
                "vertex 1 1 1\n",
                path, L"a.stl: line 7: 'endloop' is missing before 'vertex'");
    expectError("solid\nfacet normal 0 0 1\nouter loop\nvertex 0 zero 0\n", path,
                L"a.stl: line 4: 'zero' is no number for y");
    expectError("solid\n" + triangle + "endsolid\nrubbish\n", path,
                L"a.stl: line 10: 'solid' is missing before 'rubbish'");
    expectError("solid\n" + triangle + "rubbish\n", path,
                L"a.stl: line 9: 'rubbish' begins neither a facet nor the solid's end");
}
