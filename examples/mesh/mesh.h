// SPDX-License-Identifier: BSL-1.0
/// What the mesh components share with their hosts: the interface of meshes, the importer, and the
/// names and identities by which both are found.
#pragma once

#include "components/componentManager/importer.h"

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <cwchar>
#include <span>

namespace Meshes {

/// A surface made of polygons, as it was read from a file.
///
/// A mesh is immutable: any thread may use it, and the spans that it returns are valid as long as
/// the mesh. Meshes are persistent: they answer for `QrPersistant`, as objects of the class
/// `storedMeshUid`.
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

    /// The index of a corner that has no texture coordinate or no normal.
    static constexpr std::uint32_t absent = 0xFFFFFFFF;

    /// A corner of a face: indices, from 0, into `vertices()`, `texCoords()` and `normals()`. The
    /// vertex is always valid; the other two may be `absent`.
    struct Corner {
        std::uint32_t vertex;
        std::uint32_t texCoord = absent;
        std::uint32_t normal = absent;
        friend bool operator==(const Corner&, const Corner&) = default;
    };

    /// The smallest box, parallel to the axes, that contains some points.
    struct Box {
        Point low;
        Point high;
        friend bool operator==(const Box&, const Box&) = default;
    };

    /// Returns the label of the builder that read the mesh, for people. Never null; valid as long
    /// as the mesh.
    virtual const wchar_t* formatLabel() const = 0;

    /// Returns all vertices, including those without a face. All values in these three spans are
    /// finite.
    virtual std::span<const Point> vertices() const = 0;
    virtual std::span<const TexCoord> texCoords() const = 0;
    virtual std::span<const Point> normals() const = 0;

    /// Returns the number of faces.
    virtual std::size_t faceCount() const = 0;

    /// Returns the corners of a face, at least three, in the order of the file. Every index in them
    /// is valid.
    ///
    /// \param index below `faceCount()`; otherwise the behaviour is undefined
    virtual std::span<const Corner> face(std::size_t index) const = 0;

    /// Returns the box around all vertices. Both corners are the origin if there is no vertex.
    virtual Box bounds() const = 0;

    std::size_t vertexCount() const { return vertices().size(); }
};

/// Returns whether two meshes are equal in every property of their interface.
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

/// Returns whether two meshes have the same vertices, and faces of the same vertices, in the same
/// order. Texture coordinates and normals are ignored: not every format can store them.
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

/// The class of all stored meshes, whatever format they were imported from, and the uid of its
/// builder.
inline constexpr Mz::QrUid storedMeshUid{0x2D7C5A13, 0x5B0E11EF, 0x8F1D7B10, 0x5D3E8F41};

/// The builder name of all import builders whose objects answer for `Mesh`. A library that adds a
/// format describes its builder under this name; every host can then read the format.
inline constexpr const wchar_t* meshBuilderName = L"mesh";

/// Imports meshes through the first builder of the family that accepts the file.
///
/// Its objects answer for `QrImporter` too. The builders report failures to the process controller
/// as errors, with file, position and reason. A builder that is interrupted, or whose `progress`
/// call returns false, returns null without an error.
class MeshImporter : public Mz::QrBaseImporter {
  public:
    using Self = MeshImporter;
    static constexpr Mz::QrUid uid{0x2D7C5A11, 0x5B0E11EF, 0x8F1D7B10, 0x5D3E8F41};

    const wchar_t* getBuilderName() const override { return meshBuilderName; }
};

/// The uid of the builder that makes `MeshImporter` objects.
inline constexpr Mz::QrUid meshImporterBuilderUid{0x2D7C5A12, 0x5B0E11EF, 0x8F1D7B10, 0x5D3E8F41};

} // namespace Meshes
