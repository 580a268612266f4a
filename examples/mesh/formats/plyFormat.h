/// PLY, the polygon file format: elements with properties that the file itself declares.
#pragma once

#include "examples/mesh/reading/importMesh.h"

namespace Meshes {

/// Reads text and binary of both byte orders. Of the element `vertex` it takes x, y, z, the normal
/// nx, ny, nz and the texture coordinates s, t (or u, v; or texture_u, texture_v), where all of
/// them are there; of the element `face`, the list vertex_indices or vertex_index. Both may come in
/// any order, of any numeric type. Everything else is passed over; a file without faces is a mesh
/// without faces.
class PlyFormat final : public MeshFormat {
  public:
    static constexpr Mz::QrUid uid{0x2D7C5A23, 0x5B0E11EF, 0x8F1D7B10, 0x5D3E8F41};
    static constexpr const wchar_t* label = L"Polygon File Format (PLY)";
    static constexpr const wchar_t* extension = L"ply";

    bool recognises(ByteReader& bytes, bool named) const override;
    void read(ByteReader& bytes, MeshBuilder& mesh) const override;
};

} // namespace Meshes
