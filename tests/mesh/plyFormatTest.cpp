// SPDX-License-Identifier: BSL-1.0
// Tests the PLY format in text and in binary of both byte orders, and errors.
#include "meshTestSupport.h"

#include <bit>

using namespace Mz;
using namespace Meshes;

namespace {

constexpr const wchar_t* path = L"a.ply";

using Face = std::vector<std::uint32_t>;

const std::string head = "ply\nformat ascii 1.0\n";
const std::string xyz = "property float x\nproperty float y\nproperty float z\n";
const std::string indices = "property list uchar int vertex_indices\n";
const std::string points = "0 0 0\n1 0 0\n1 1 0\n0 1 0\n";
const std::string square =
    head + "element vertex 4\n" + xyz + "element face 1\n" + indices + "end_header\n" + points;

/// Writes numbers as bytes in either order.
class Bytes {
  public:
    explicit Bytes(bool bigEndian) : bigEndian(bigEndian) {}

    Bytes& add(std::uint64_t bits, int size) {
        for (int index = 0; index < size; ++index)
            text.push_back(static_cast<char>(bits >> 8 * (bigEndian ? size - 1 - index : index)));
        return *this;
    }
    Bytes& addFloat(float number) { return add(std::bit_cast<std::uint32_t>(number), 4); }
    Bytes& addDouble(double number) { return add(std::bit_cast<std::uint64_t>(number), 8); }

    std::string text;

  private:
    bool bigEndian;
};

std::string binaryHead(bool bigEndian) {
    return std::string("ply\nformat binary_") + (bigEndian ? "big" : "little") + "_endian 1.0\n";
}

} // namespace

TEST(PlyFormat, ReadsVerticesAndPolygons) {
    const QrPtr<Mesh> mesh = meshOf(square + "4 0 1 2 3\n", path);
    EXPECT_EQ(mesh->vertexCount(), 4U);
    EXPECT_EQ(faceOf(*mesh, 0), (Face{0, 1, 2, 3}));
}

TEST(PlyFormat, ReadsHeadersOfAnyLineEnd) {
    for (const std::string end : {"\n", "\r\n", "\r"}) {
        std::string header = binaryHead(false) +
                             "comment from\tfar away\nobj_info none\n"
                             "element vertex 1\n" +
                             xyz + "end_header\n";
        for (std::size_t at = header.find('\n'); at != header.npos;
             at = header.find('\n', at + end.size()))
            header.replace(at, 1, end);
        // The first byte of the data is a line feed, as if it belonged to the header.
        const Bytes data = Bytes(false).add(0x3F80000A, 4).addFloat(2).addFloat(3);
        const QrPtr<Mesh> mesh = meshOf(header + data.text, L"unnamed");
        EXPECT_EQ(mesh->vertices()[0], (Mesh::Point{std::bit_cast<float>(0x3F80000AU), 2, 3}));
    }
}

TEST(PlyFormat, ReadsEveryTypeUnderBothNames) {
    const std::pair<const char*, int> types[] = {
        {"char", 1},   {"int8", 1},   {"uchar", 1}, {"uint8", 1}, {"short", 2}, {"int16", 2},
        {"ushort", 2}, {"uint16", 2}, {"int", 4},   {"int32", 4}, {"uint", 4},  {"uint32", 4}};
    for (const bool bigEndian : {false, true}) {
        for (const auto& [name, size] : types) {
            const std::string type = name;
            const std::string header = binaryHead(bigEndian) + "element vertex 3\nproperty " +
                                       type + " x\nproperty " + type +
                                       " y\nproperty float64 z\nelement face 1\nproperty list " +
                                       type + " " + type + " vertex_index\nend_header\n";
            Bytes data(bigEndian);
            for (int vertex = 0; vertex < 3; ++vertex)
                data.add(7, size).add(static_cast<std::uint64_t>(-1), size).addDouble(0.5);
            data.add(3, size).add(2, size).add(1, size).add(0, size);
            const QrPtr<Mesh> mesh = meshOf(header + data.text, path);
            const bool isUnsigned = type[0] == 'u';
            const float largest = size == 1 ? 255.0F : size == 2 ? 65535.0F : 4294967295.0F;
            EXPECT_EQ(mesh->vertices()[0], (Mesh::Point{7, isUnsigned ? largest : -1, 0.5F}));
            EXPECT_EQ(faceOf(*mesh, 0), (Face{2, 1, 0}));
        }
    }
}

TEST(PlyFormat, ReadsElementsInAnyOrderAndPassesOverTheRest) {
    const std::string properties =
        "element camera 1\nproperty float f\nproperty list uchar double parts\n"
        "element face 1\nproperty uchar red\n" +
        indices +
        "property list uchar float texcoord\nelement vertex 3\nproperty double y\n"
        "property list char short extra\nproperty float32 x\nproperty uchar red\n"
        "property float z\nelement empty 4294967295\nend_header\n";
    const QrPtr<Mesh> mesh = meshOf(head + properties +
                                        "1 2 nan 0\n255 3 2 1 0 1 0.5\n"
                                        "1 2 9 9 0 255 3\n4 0 5 255 6\n7 0 8 0 9\n",
                                    path);
    EXPECT_EQ(mesh->vertices()[0], (Mesh::Point{0, 1, 3}));
    EXPECT_EQ(mesh->vertices()[2], (Mesh::Point{8, 7, 9}));
    EXPECT_EQ(faceOf(*mesh, 0), (Face{2, 1, 0}));

    Bytes data(true);
    data.addFloat(1).add(1, 1).addDouble(2);
    data.add(255, 1).add(3, 1).add(2, 4).add(1, 4).add(0, 4).add(1, 1).addFloat(0.5F);
    for (int vertex = 0; vertex < 3; ++vertex)
        data.addDouble(1).add(2, 1).add(9, 2).add(9, 2).addFloat(0).add(255, 1).addFloat(3);
    EXPECT_EQ(meshOf(binaryHead(true) + properties + data.text, path)->vertices()[2],
              (Mesh::Point{0, 1, 3}));
}

TEST(PlyFormat, ReadsNormalsAndTextureCoordinatesOfVertices) {
    const QrPtr<Mesh> mesh =
        meshOf(head + "element vertex 3\n" + xyz +
                   "property float nx\nproperty float ny\nproperty float nz\nproperty float s\n"
                   "property float t\nelement face 1\n" +
                   indices +
                   "end_header\n0 0 0 0 0 1 0.5 1\n1 0 0 0 1 0 0 0\n0 1 0 1 0 0 0 0\n"
                   "3 0 1 2\n",
               path);
    EXPECT_EQ(mesh->normals()[1], (Mesh::Point{0, 1, 0}));
    EXPECT_EQ(mesh->texCoords()[0], (Mesh::TexCoord{0.5F, 1}));
    EXPECT_EQ(mesh->face(0)[1], (Mesh::Corner{1, 1, 1}));
}

TEST(PlyFormat, ReadsPointsWithoutFaces) {
    const QrPtr<Mesh> mesh =
        meshOf(head + "element vertex 4\n" + xyz + "end_header\n" + points, path);
    EXPECT_EQ(mesh->vertexCount(), 4U);
    EXPECT_EQ(mesh->faceCount(), 0U);
}

TEST(PlyFormat, RefusesDamagedHeaders) {
    const std::pair<std::string, std::wstring> cases[] = {
        {"ply\n", L"line 2: the file ends inside its header"},
        {"ply\nformat ascii 2.0\n", L"line 2: version '2.0' is not supported"},
        {"ply\nformat morse 1.0\n", L"line 2: 'morse' is no encoding"},
        {"ply\nelement vertex 1\n", L"line 2: 'format' with an encoding and a version is missing"},
        {head + "element vertex\n", L"line 3: 'element' without a name and a count"},
        {head + "element vertex 4294967296\n", L"line 3: 'element' without a name and a count"},
        {head + "element vertex -1\n", L"line 3: 'element' without a name and a count"},
        {head + "property float x\n", L"line 3: 'property' before the first element"},
        {head + "element a 1\nproperty real x\n", L"line 4: 'real' is no type"},
        {head + "element a 1\nproperty list float int x\n",
         L"line 4: a list cannot be counted by 'float'"},
        {head + "element a 1\nproperty list int x\n",
         L"line 4: 'property' without a type and a name"},
        {head + "element a 1\nelement a 1\n", L"line 4: 'a' is there twice"},
        {head + "what\n", L"line 3: 'what' begins no line of the header"},
        {head + std::string(5000, 'x') + "\n", L"line 3: a header line of more than 4096 bytes"},
        {head + "end_header\n", L"the header declares no element 'vertex' with x, y and z"},
        {head + "element vertex 0\n" + xyz + "element face 1\nproperty int x\nend_header\n",
         L"the header declares faces without a list of vertices"},
    };
    for (const auto& [data, error] : cases)
        expectError(data, path, L"a.ply: " + error);
}

TEST(PlyFormat, RefusesTooManyDeclarations) {
    std::string data = head;
    for (int count = 0; count < 1001; ++count)
        data += "element e" + std::to_string(count) + " 0\n";
    expectError(data, path, L"a.ply: line 1003: more than 1000 of one kind");
}

TEST(PlyFormat, RefusesDamagedText) {
    expectError(square + "3 0 1 4\n", path,
                L"a.ply: line 14: the face refers to vertex 4, but there are only 4");
    expectError(square + "3 0 1 -1\n", path, L"a.ply: line 14: '-1' is no index and no length");
    expectError(square + "3 0 1 4294967295\n", path,
                L"a.ply: line 14: '4294967295' is no index and no length");
    expectError(square + "3 0 1\n", path, L"a.ply: line 14: the line has too few values");
    expectError(square + "4294967294 0 1\n", path, L"a.ply: line 14: the line has too few values");
    expectError(square + "3 0 1 2 3\n", path,
                L"a.ply: line 14: '3' is more than this line may have");
    expectError(square + "2 0 1\n", path,
                L"a.ply: line 14: a face needs three corners or more, not 2");
    expectError(square, path, L"a.ply: line 13: the file ends at 'face' 0 of 1");
    expectError(square + "3 0 1 2\n3 0 1 2\n", path,
                L"a.ply: line 15: '3' stands behind the last element");
    expectError(head + "element vertex 1\n" + xyz + "end_header\n0 inf 0\n", path,
                L"a.ply: line 8: 'inf' is no number");
    expectError(head + "element vertex 4294967295\n" + xyz + "end_header\n" + points, path,
                L"a.ply: line 11: the file ends at 'vertex' 4 of 4294967295");
}

TEST(PlyFormat, RefusesDamagedBinaryData) {
    const std::string header = binaryHead(false) + "element vertex 3\n" + xyz +
                               "element face 1\nproperty list int int vertex_indices\n"
                               "end_header\n";
    Bytes vertices(false);
    for (int count = 0; count < 9; ++count)
        vertices.addFloat(0);
    const std::string start = header + vertices.text;
    const std::wstring place = L"a.ply: byte " + std::to_wstring(start.size()) + L": ";
    const auto face = [](int count, int last) {
        return Bytes(false)
            .add(static_cast<std::uint64_t>(count), 4)
            .add(0, 4)
            .add(1, 4)
            .add(static_cast<std::uint64_t>(last), 4)
            .text;
    };
    EXPECT_EQ(meshOf(start + face(3, 2) + "\r\n", path)->faceCount(), 1U);
    expectError(start + face(3, 3), path,
                place + L"the face refers to vertex 3, but there are only 3");
    expectError(start + face(3, -1), path, place + L"a negative or too large index or length");
    expectError(start + face(-3, 2), path, place + L"a negative or too large index or length");
    expectError(start + face(0x7FFFFFFF, 2), path, place + L"the file ends at 'face' 0 of 1");
    expectError(start + face(3, 2) + "x", path,
                L"a.ply: byte " + std::to_wstring(start.size() + 16) +
                    L": there is more data than elements");
    const std::string wide = binaryHead(true) +
                             "element vertex 1\nproperty double x\n"
                             "property double y\nproperty double z\nend_header\n";
    for (const double number : {1e39, -1e300, std::bit_cast<double>(0x7FF8000000000000)})
        expectError(wide + Bytes(true).addDouble(0).addDouble(number).addDouble(0).text, path,
                    L"a.ply: byte " + std::to_wstring(wide.size()) + L": a value is not finite");
}
