// SPDX-License-Identifier: BSL-1.0
/// The format OFF (object file format): counts, then one line for each vertex and each face.
#pragma once

#include "examples/mesh/reading/importMesh.h"

namespace Meshes {

/// Reads the text form with the headers OFF, NOFF (normals), COFF (colours), STOFF (texture
/// coordinates) and their combinations. Skips the colours of vertices and faces. The binary form,
/// and points without exactly three dimensions (4OFF, nOFF), are rejected with a message that names
/// them.
///
/// '#' begins a comment anywhere. The counts may be on the line of the header; the count of edges
/// is optional.
class OffFormat final : public MeshFormat {
  public:
    static constexpr Mz::QrUid uid{0x2D7C5A21, 0x5B0E11EF, 0x8F1D7B10, 0x5D3E8F41};
    static constexpr const wchar_t* label = L"Object File Format (OFF)";
    static constexpr const wchar_t* extension = L"off";

    bool recognises(ByteReader& bytes, bool named) const override;
    void read(ByteReader& bytes, MeshBuilder& mesh) const override;
};

} // namespace Meshes
