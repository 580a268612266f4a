/// STL: triangles, each with its own three points, as text or in binary.
#pragma once

#include "examples/mesh/reading/importMesh.h"

namespace Meshes {

/// Reads both forms. Points of the same coordinates become one vertex, numbered in the order of
/// their first use, so that a solid is the same mesh as in formats that share vertices. The facets'
/// normals follow from their corners and are not kept; the text form's keywords may be in upper
/// case, and several solids in one file become one mesh.
///
/// A binary file may begin with "solid", as text does. So the size decides: a file of 84 bytes and
/// 50 for each facet that it counts is binary.
class StlFormat final : public MeshFormat {
  public:
    static constexpr Mz::QrUid uid{0x2D7C5A22, 0x5B0E11EF, 0x8F1D7B10, 0x5D3E8F41};
    static constexpr const wchar_t* label = L"Stereolithography (STL)";
    static constexpr const wchar_t* extension = L"stl";

    bool recognises(ByteReader& bytes, bool named) const override;
    void read(ByteReader& bytes, MeshBuilder& mesh) const override;
};

} // namespace Meshes
