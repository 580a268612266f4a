/// OFF, the object file format: counts, then a line for each vertex and each face.
#pragma once

#include "examples/mesh/reading/importMesh.h"

namespace Meshes {

/// Reads the text form with the headers OFF, NOFF (normals), COFF (colours), STOFF (texture
/// coordinates) and their combinations. Colours, of vertices and of faces, are passed over. The
/// binary form and points of other than three dimensions (4OFF, nOFF) are refused by name.
///
/// '#' begins a comment anywhere. The counts may stand on the header's line; that of edges may be
/// missing.
class OffFormat final : public MeshFormat {
  public:
    static constexpr Mz::QrUid uid{0x2D7C5A21, 0x5B0E11EF, 0x8F1D7B10, 0x5D3E8F41};
    static constexpr const wchar_t* label = L"Object File Format (OFF)";
    static constexpr const wchar_t* extension = L"off";

    bool recognises(ByteReader& bytes, bool named) const override;
    void read(ByteReader& bytes, MeshBuilder& mesh) const override;
};

} // namespace Meshes
