// SPDX-License-Identifier: BSL-1.0
/// The format Wavefront OBJ: one statement per line, about vertices and faces.
#pragma once

#include "examples/mesh/reading/importMesh.h"

namespace Meshes {

/// Reads `v` (three coordinates; skips a weight or a colour after them), `vt` (the first two
/// values), `vn` and `f`, with all forms of corners and polygons of any size. Skips all other
/// statements of the format. An unknown statement is an error.
///
/// Positive indices count from 1 through the whole file, so a face may refer to elements that
/// follow it. Negative indices count back from the face. The index 0 is an error, and so is an
/// index beyond the last element.
class ObjFormat final : public MeshFormat {
  public:
    static constexpr Mz::QrUid uid{0x2D7C5A20, 0x5B0E11EF, 0x8F1D7B10, 0x5D3E8F41};
    static constexpr const wchar_t* label = L"Wavefront OBJ";
    static constexpr const wchar_t* extension = L"obj";

    bool recognises(ByteReader& bytes, bool named) const override;
    void read(ByteReader& bytes, MeshBuilder& mesh) const override;
};

} // namespace Meshes
