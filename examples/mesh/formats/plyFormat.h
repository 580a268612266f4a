// SPDX-License-Identifier: BSL-1.0
/// The format PLY (polygon file format): elements with properties that the file itself declares.
#pragma once

#include "examples/mesh/reading/importMesh.h"

namespace Meshes {

/// Reads text, and binary data in both byte orders. Of the element `vertex` it reads x, y, z and,
/// if all of them are present, the normal nx, ny, nz and the texture coordinates s, t (or u, v; or
/// texture_u, texture_v). Of the element `face` it reads the list vertex_indices or vertex_index.
/// The properties may be in any order and of any numeric type. Everything else is skipped. A file
/// without faces is a mesh without faces.
class PlyFormat final : public MeshFormat {
  public:
    static constexpr Mz::QrUid uid{0x2D7C5A23, 0x5B0E11EF, 0x8F1D7B10, 0x5D3E8F41};
    static constexpr const wchar_t* label = L"Polygon File Format (PLY)";
    static constexpr const wchar_t* extension = L"ply";

    bool recognises(ByteReader& bytes, bool named) const override;
    void read(ByteReader& bytes, MeshBuilder& mesh) const override;
};

} // namespace Meshes
