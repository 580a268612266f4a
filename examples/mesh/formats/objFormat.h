/// Wavefront OBJ: statements of one line each, about vertices and faces.
#pragma once

#include "examples/mesh/reading/importMesh.h"

namespace Meshes {

/// Reads `v` (three coordinates; a weight or a colour behind them is passed over), `vt` (the first
/// two values), `vn` and `f`, in all forms of its corners, with polygons of any size. All other
/// statements of the format are passed over; a word that begins no statement is an error.
///
/// Positive indices count from 1 through the whole file, so a face may name what only follows it;
/// negative ones count back from the face. 0 is an error, as is what is beyond the last element.
class ObjFormat final : public MeshFormat {
  public:
    static constexpr Mz::QrUid uid{0x2D7C5A20, 0x5B0E11EF, 0x8F1D7B10, 0x5D3E8F41};
    static constexpr const wchar_t* label = L"Wavefront OBJ";
    static constexpr const wchar_t* extension = L"obj";

    bool recognises(ByteReader& bytes, bool named) const override;
    void read(ByteReader& bytes, MeshBuilder& mesh) const override;
};

} // namespace Meshes
