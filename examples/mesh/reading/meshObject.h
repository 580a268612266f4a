// SPDX-License-Identifier: BSL-1.0
/// The implementation of `Mesh`: a counted, persistent object.
#pragma once

#include "examples/mesh/mesh.h"

#include "components/componentManager/persistant.h"

#include <algorithm>
#include <cstddef>
#include <span>
#include <string>
#include <vector>

namespace Meshes {

/// The elements of a mesh. The lists grow as data arrives; no count of a file reserves memory.
struct MeshData {
    std::vector<Mesh::Point> vertices;
    std::vector<Mesh::TexCoord> texCoords;
    std::vector<Mesh::Point> normals;
    std::vector<Mesh::Corner> corners; ///< of all faces, one face after the other
    std::vector<std::size_t> faceEnds; ///< for each face, where its corners end
};

class MeshObject final
    : public Mz::QrCastRef<Mz::QrCastHeap<Mz::QrCastMulti<MeshObject, Mesh, Mz::QrPersistant>>> {
  public:
    /// Makes an empty mesh, for `read`.
    MeshObject() = default;
    MeshObject(MeshData meshData, const wchar_t* formatLabel);

    /// Returns a new mesh. The caller owns the reference.
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
    /// Replaces the mesh by the one in the stream.
    ///
    /// \throws QrStreamEx::ExReadError if the data is not a mesh with the properties that `Mesh`
    ///     promises; the object is then unchanged
    void read(Mz::QrStream& stream) override;

  private:
    MeshData data;
    std::wstring label;
    Box box{};
};

} // namespace Meshes
