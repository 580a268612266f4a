// SPDX-License-Identifier: BSL-1.0
// Tests how much memory the formats allocate, with valid and with false sizes and with long words.

#include "allocationCount.h"

#include "components/componentManager/processControl.h"
#include "examples/mesh/formats/objFormat.h"
#include "examples/mesh/formats/offFormat.h"
#include "examples/mesh/formats/plyFormat.h"
#include "examples/mesh/formats/stlFormat.h"

#include <gtest/gtest.h>

#include <sstream>

using namespace Mz;
using namespace Meshes;

namespace {

struct Measured {
    bool accepted;
    bool imported;
    std::size_t memory;
};

Measured measure(const MeshFormat& format, const std::string& data) {
    std::istringstream stream(data);
    QrInBuffer buffer(&stream);
    const std::size_t before = allocatedBytes();
    const bool accepted = recognisesMesh(format, buffer, L"a.obj", L"obj");
    stream.clear();
    stream.seekg(0);
    QrSetSystemProcessController(nullptr);
    const bool imported = bool(importMesh(format, buffer, L"a.obj", L"label"));
    return {accepted, imported, allocatedBytes() - before};
}

/// The memory of two readers and a few words.
constexpr std::size_t little = 0x40000;

void expectRefusedWithLittleMemory(const MeshFormat& format, const std::string& data) {
    const Measured measured = measure(format, data);
    EXPECT_FALSE(measured.imported);
    EXPECT_LT(measured.memory, little);
}

const std::string longText(8 << 20, 'x');

} // namespace

TEST(MeshMemory, IsNotTakenForCountsThatAFileOnlyPromises) {
    const std::string point = "0 0 0\n";
    const std::string vertices = "element vertex 4294967295\nproperty float x\nproperty float y\n"
                                 "property float z\n";
    const std::string faces = "element face 4294967295\nproperty list uint uint vertex_indices\n";
    const std::string huge(16, '\xF0');
    expectRefusedWithLittleMemory(OffFormat(), "OFF\n4294967295 4294967295 0\n" + point);
    expectRefusedWithLittleMemory(OffFormat(), "OFF\n1 1 0\n" + point + "4294967295 0 0 0\n");
    expectRefusedWithLittleMemory(PlyFormat(),
                                  "ply\nformat ascii 1.0\n" + vertices + faces + "end_header\n");
    expectRefusedWithLittleMemory(PlyFormat(), "ply\nformat binary_little_endian 1.0\n" + vertices +
                                                   "end_header\n" + huge);
    expectRefusedWithLittleMemory(PlyFormat(), "ply\nformat binary_big_endian 1.0\n" + faces +
                                                   vertices + "end_header\n" + huge);
    expectRefusedWithLittleMemory(StlFormat(), std::string(80, '\0') + huge);
}

TEST(MeshMemory, IsNotTakenForLongWordsAndLines) {
    for (const std::string start : {"", "v 0 0 0\nv ", "v 0 0 0\nf ", "v 0 0 0\nf 1 2 "})
        expectRefusedWithLittleMemory(ObjFormat(), start + longText);
    for (const std::string start : {"", "OFF ", "OFF\n1 0 0\n0 0 ", "OFF\n1 1 0\n0 0 0\n3 0 0 "})
        expectRefusedWithLittleMemory(OffFormat(), start + longText);
    for (const std::string start : {"ply", "ply\n", "ply\nformat ascii 1.0\ncomment "})
        expectRefusedWithLittleMemory(PlyFormat(), start + longText);
    for (const std::string start : {"", "solid ", "solid a\n", "solid a\nfacet normal 0 0 "})
        expectRefusedWithLittleMemory(StlFormat(), start + longText);
}

TEST(MeshMemory, IsNotTakenForWhatIsPassedOver) {
    std::string manyWords;
    for (int count = 0; count < 200000; ++count)
        manyWords += " word \\\n";
    const std::string end = "\nv 0 0 0\nv 1 0 0\nv 0 1 0\nf 1 2 3\n";
    for (const std::string& data :
         {"# " + longText + end, "usemtl " + longText + end, "g" + manyWords + end,
          longText.substr(0, 0) + end, std::string(1 << 20, '\n') + end,
          std::string(1 << 20, ' ') + end}) {
        const Measured measured = measure(ObjFormat(), data);
        EXPECT_TRUE(measured.accepted);
        EXPECT_TRUE(measured.imported);
        EXPECT_LT(measured.memory, little);
    }
}

TEST(MeshMemory, GrowsWithTheData) {
    std::string data = "v 0 0 0\nf";
    for (int count = 0; count < 100000; ++count)
        data += " 1";
    const Measured measured = measure(ObjFormat(), data + "\n");
    EXPECT_TRUE(measured.imported);
    // A corner takes 12 bytes. A growing list is copied a few times.
    EXPECT_GT(measured.memory, 100000 * 12);
    EXPECT_LT(measured.memory, 100000 * 12 * 6);
}
