/// The mesh as an object that any host can hold, store and load.
#pragma once

#include "examples/mesh/mesh.h"

#include "components/componentManager/persistant.h"

#include <string>
#include <vector>

namespace Meshes {

/// What a mesh is made of. It grows as data arrives; nothing is reserved on a file's word.
struct MeshData {
    std::vector<Mesh::Point> vertices;
    std::vector<Mesh::TexCoord> texCoords;
    std::vector<Mesh::Point> normals;
    std::vector<Mesh::Corner> corners; ///< of all faces, one face behind the other
    std::vector<std::size_t> faceEnds; ///< for each face, where its corners end
};

class MeshObject final
    : public Mz::QrCastRef<Mz::QrCastHeap<Mz::QrCastMulti<MeshObject, Mesh, Mz::QrPersistant>>> {
  public:
    /// Without anything in it, to be read into.
    MeshObject() = default;
    MeshObject(MeshData meshData, const wchar_t* formatLabel);

    static Mz::QrRef<Mz::QrCastable> make(MeshData data, const wchar_t* formatLabel);

    const wchar_t* formatLabel() const override { return label.c_str(); }
    std::span<const Point> vertices() const override { return data.vertices; }
    std::span<const TexCoord> texCoords() const override { return data.texCoords; }
    std::span<const Point> normals() const override { return data.normals; }
    std::size_t faceCount() const override { return data.faceEnds.size(); }
    std::span<const Corner> face(std::size_t index) const override;
    Box bounds() const override { return box; }

    const Mz::QrUid* getClassUid() const override { return &storedMeshUid; }
    unsigned int getVersion() const override { return 1; }
    void write(Mz::QrStream& stream) override;
    /// Raises `QrStreamEx::ExReadError`, and changes nothing, when the data is no mesh that keeps
    /// what `Mesh` promises.
    void read(Mz::QrStream& stream) override;

  private:
    MeshData data;
    std::wstring label;
    Box box{};
};

} // namespace Meshes
