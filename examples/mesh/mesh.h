/// What the mesh components and their hosts agree on: the mesh, the importer, and the names by
/// which both are found.
#pragma once

#include "components/componentManager/importer.h"

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <cwchar>
#include <span>

namespace Meshes {

/// A surface made of polygons, as it was read from a file. It never changes, so any thread may look
/// at it, and what it hands out is valid as long as the mesh.
///
/// Meshes are persistent: they answer for `QrPersistant`, as objects of the class `storedMeshUid`.
class Mesh : public Mz::QrCastable {
  public:
    using Self = Mesh;
    static constexpr Mz::QrUid uid{0x2D7C5A10, 0x5B0E11EF, 0x8F1D7B10, 0x5D3E8F41};

    struct Point {
        float x, y, z;
        friend bool operator==(const Point&, const Point&) = default;
    };

    struct TexCoord {
        float u, v;
        friend bool operator==(const TexCoord&, const TexCoord&) = default;
    };

    /// In place of an index that a corner does not have.
    static constexpr std::uint32_t absent = 0xFFFFFFFF;

    /// A corner of a face: indices, counted from 0, into `vertices()`, `texCoords()` and
    /// `normals()`. The first is always there; the other two may be `absent`.
    struct Corner {
        std::uint32_t vertex;
        std::uint32_t texCoord = absent;
        std::uint32_t normal = absent;
        friend bool operator==(const Corner&, const Corner&) = default;
    };

    /// The smallest box, parallel to the axes, round some points.
    struct Box {
        Point low;
        Point high;
        friend bool operator==(const Box&, const Box&) = default;
    };

    /// The label of the builder that read the mesh, for people.
    virtual const wchar_t* formatLabel() const = 0;

    /// All vertices, those without a face included. All values in these three are finite.
    virtual std::span<const Point> vertices() const = 0;
    virtual std::span<const TexCoord> texCoords() const = 0;
    virtual std::span<const Point> normals() const = 0;

    virtual std::size_t faceCount() const = 0;

    /// The corners of a face, at least three, in the order of the file; `index` is below
    /// `faceCount()`. Every index in them is valid.
    virtual std::span<const Corner> face(std::size_t index) const = 0;

    /// The box round all vertices; of a mesh without vertices, the origin.
    virtual Box bounds() const = 0;

    std::size_t vertexCount() const { return vertices().size(); }
};

/// Whether two meshes are the same in everything that can be asked of them.
inline bool areEqual(const Mesh& a, const Mesh& b) {
    if (std::wcscmp(a.formatLabel(), b.formatLabel()) != 0 ||
        !std::ranges::equal(a.vertices(), b.vertices()) ||
        !std::ranges::equal(a.texCoords(), b.texCoords()) ||
        !std::ranges::equal(a.normals(), b.normals()) || a.faceCount() != b.faceCount())
        return false;
    for (std::size_t index = 0; index < a.faceCount(); ++index)
        if (!std::ranges::equal(a.face(index), b.face(index)))
            return false;
    return true;
}

/// Whether two meshes have the same vertices, and faces of the same vertices, in the same order.
/// Texture coordinates and normals do not matter: not every format can hold them.
inline bool haveSameGeometry(const Mesh& a, const Mesh& b) {
    const auto sameVertex = [](const Mesh::Corner& p, const Mesh::Corner& q) {
        return p.vertex == q.vertex;
    };
    if (!std::ranges::equal(a.vertices(), b.vertices()) || a.faceCount() != b.faceCount())
        return false;
    for (std::size_t index = 0; index < a.faceCount(); ++index)
        if (!std::ranges::equal(a.face(index), b.face(index), sameVertex))
            return false;
    return true;
}

/// The class of all stored meshes, whatever format they were imported from, and its builder.
inline constexpr Mz::QrUid storedMeshUid{0x2D7C5A13, 0x5B0E11EF, 0x8F1D7B10, 0x5D3E8F41};

/// The builder name of all import builders whose objects answer for `Mesh`. A library that adds a
/// format registers its builder under this name, and every host can read it.
inline constexpr const wchar_t* meshBuilderName = L"mesh";

/// Imports meshes, through whichever builder of the family can read the file.
///
/// Its objects answer for `QrImporter` too. Failures are told to the process controller as errors,
/// with file, place and reason; a builder that is interrupted, or told by `progress` not to go on,
/// returns null without an error.
class MeshImporter : public Mz::QrBaseImporter {
  public:
    using Self = MeshImporter;
    static constexpr Mz::QrUid uid{0x2D7C5A11, 0x5B0E11EF, 0x8F1D7B10, 0x5D3E8F41};

    const wchar_t* getBuilderName() const override { return meshBuilderName; }
};

/// The builder whose objects are `MeshImporter`s.
inline constexpr Mz::QrUid meshImporterBuilderUid{0x2D7C5A12, 0x5B0E11EF, 0x8F1D7B10, 0x5D3E8F41};

} // namespace Meshes
