// SPDX-License-Identifier: BSL-1.0
// Imports mesh files of every format by their content alone, and stores and loads every mesh. Also
// loads any bytes as a stored mesh, and stored meshes whose faces have any corners.
//
// Input: the format, the file; or a choice of the last two kinds, and the bytes of that mesh.
#include "components/componentManager/binaryStream.h"
#include "components/componentManager/processControl.h"
#include "components/componentManager/textStream.h"
#include "examples/mesh/formats/objFormat.h"
#include "examples/mesh/formats/offFormat.h"
#include "examples/mesh/formats/plyFormat.h"
#include "examples/mesh/formats/stlFormat.h"
#include "examples/mesh/reading/meshObject.h"
#include "fuzz/fuzz.h"

#include <cmath>
#include <sstream>

namespace {

using namespace Mz;
using namespace Meshes;

QrRef<QrCastable> importBy(const MeshFormat& format, std::string_view content) {
    std::istringstream source{std::string(content)};
    QrInBuffer io(&source);
    recognisesMesh(format, io, L"", L"");
    io.read(); // Clears the end of input, if it was reached.
    io.seek(0, 0);
    return importMesh(format, io, L"", L"format");
}

void expectPromises(const Mesh& mesh) {
    for (const Mesh::Point& p : mesh.vertices())
        Fuzz::expect(std::isfinite(p.x) && std::isfinite(p.y) && std::isfinite(p.z), "finite");
    for (std::size_t index = 0; index < mesh.faceCount(); ++index) {
        Fuzz::expect(mesh.face(index).size() >= 3, "a face has three corners at least");
        for (const Mesh::Corner& corner : mesh.face(index)) {
            Fuzz::expect(corner.vertex < mesh.vertexCount(), "a valid vertex");
            Fuzz::expect(corner.texCoord == Mesh::absent ||
                             corner.texCoord < mesh.texCoords().size(),
                         "a valid texture coordinate");
            Fuzz::expect(corner.normal == Mesh::absent || corner.normal < mesh.normals().size(),
                         "a valid normal");
        }
    }
}

template <class Stream>
void expectStored(MeshObject& mesh) {
    std::stringstream store;
    QrOutBuffer out(&store);
    Stream writer(&out);
    mesh.write(writer);
    QrInBuffer in(&store);
    Stream reader(&in);
    MeshObject again;
    again.read(reader);
    Fuzz::expect(areEqual(mesh, again), "what was stored comes back");
}

/// Reads any bytes as a stored mesh.
void readStored(std::string_view content) {
    std::istringstream source{std::string(content)};
    QrInBuffer io(&source);
    QrBinaryStream stream(&io);
    MeshObject mesh;
    Fuzz::outcomeOf([&] {
        mesh.read(stream);
        return std::string();
    });
    expectPromises(mesh);
}

/// Returns a stored mesh: three counts of vertices, texture coordinates and normals; then, for each
/// face, the number of its corners, and what each refers to. Each of them is one byte. Random bytes
/// rarely have indices that are just beyond a list.
std::string storedMesh(Fuzz::Input& input) {
    std::ostringstream store;
    QrOutBuffer io(&store);
    QrBinaryStream stream(&io);
    for (const int values : {3, 2, 3}) { // Of a vertex, a texture coordinate, a normal.
        const unsigned int count = input.byte() % 8;
        stream << count;
        for (unsigned int value = 0; value < count * static_cast<unsigned int>(values); ++value)
            stream << static_cast<float>(value);
    }
    const unsigned int faces = input.byte() % 8;
    stream << faces;
    for (unsigned int face = 0; face < faces; ++face) {
        const unsigned int corners = input.byte() % 8;
        stream << corners;
        for (unsigned int reference = 0; reference < 3 * corners; ++reference) {
            const unsigned int index = input.byte() % 9; // 7 is the longest list.
            stream << (index == 8 ? Mesh::absent : index);
        }
    }
    return store.str();
}

} // namespace

int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    static const ObjFormat obj;
    static const OffFormat off;
    static const PlyFormat ply;
    static const StlFormat stl;
    static const MeshFormat* const formats[] = {&obj, &off, &ply, &stl};
    QrSetSystemProcessController(nullptr); // Errors are not reported.

    Fuzz::Input input(data, size);
    const unsigned int which = input.byte() % 6;
    if (which >= 4) {
        readStored(which == 4 ? input.rest() : storedMesh(input));
        return 0;
    }
    const QrRef<QrCastable> object = importBy(*formats[which], input.rest());
    if (!object)
        return 0;
    auto& mesh = static_cast<MeshObject&>(*queryCast<Mesh>(object.get()));
    expectPromises(mesh);
    expectStored<QrBinaryStream>(mesh);
    expectStored<QrTextStream>(mesh);
    return 0;
}
