// SPDX-License-Identifier: BSL-1.0
/// Collects the elements of a mesh while its file is read.
#pragma once

#include "meshObject.h"

#include <cstddef>
#include <cstdint>
#include <span>
#include <string>
#include <vector>

namespace Meshes {

/// Collects a mesh. A face may refer to vertices that follow it; `finish` checks that all exist.
///
/// `addVertex`, `addTexCoord` and `addNormal` throw `ImportFailure` if 32-bit indices do not
/// suffice.
class MeshBuilder {
  public:
    std::size_t vertexCount() const { return data.vertices.size(); }
    std::size_t texCoordCount() const { return data.texCoords.size(); }
    std::size_t normalCount() const { return data.normals.size(); }

    void addVertex(Mesh::Point vertex);
    void addTexCoord(Mesh::TexCoord texCoord);
    void addNormal(Mesh::Point normal);

    /// Adds a corner to the current face.
    void addCorner(const Mesh::Corner& corner);

    /// Returns the corners of the current face; valid until one is added.
    std::span<Mesh::Corner> openFace();

    /// Ends the current face. `unit` and `place` are its position in the file ("line", 12), for the
    /// failure that `finish` throws if one of its indices is invalid. `unit` is not copied.
    ///
    /// \throws ImportFailure if the face has fewer than three corners
    void endFace(const char* unit, std::uint64_t place);

    /// Moves the mesh out of the builder, which must not be used after that.
    ///
    /// \throws ImportFailure if a face refers to an element that does not exist
    MeshData finish();

    /// Sets the first index of the format, for messages; 0 by default.
    void countFrom(unsigned int first) { firstIndex = first; }

  private:
    /// The largest index used so far, and the position of the first face that used it.
    struct Largest {
        std::int64_t index = -1;
        const char* unit = "";
        std::uint64_t place = 0;
    };

    static void note(Largest& largest, std::uint32_t index, const char* unit, std::uint64_t place);
    void check(const Largest& largest, std::size_t count, const char* what) const;

    MeshData data;
    std::size_t openCorners = 0;
    Largest largestVertex;
    Largest largestTexCoord;
    Largest largestNormal;
    unsigned int firstIndex = 0;
};

} // namespace Meshes
