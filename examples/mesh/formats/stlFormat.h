// SPDX-License-Identifier: BSL-1.0
/// The format STL: triangles, each with its own three points, as text or in binary.
#pragma once

#include "examples/mesh/reading/importMesh.h"

namespace Meshes {

/// Reads both forms. Points with equal coordinates become one vertex, numbered in the order of
/// their first use, so that the mesh equals one from a format that shares vertices. The normals of
/// facets are not stored, because they follow from the corners. The keywords of the text form may
/// be in upper case. Several solids in one file become one mesh.
///
/// A binary file may begin with "solid", as text does. Therefore the size decides: a file of 84
/// bytes plus 50 for each facet of its count is binary.
class StlFormat final : public MeshFormat {
  public:
    static constexpr Mz::QrUid uid{0x2D7C5A22, 0x5B0E11EF, 0x8F1D7B10, 0x5D3E8F41};
    static constexpr const wchar_t* label = L"Stereolithography (STL)";
    static constexpr const wchar_t* extension = L"stl";

    bool recognises(ByteReader& bytes, bool named) const override;
    void read(ByteReader& bytes, MeshBuilder& mesh) const override;
};

} // namespace Meshes
