/// Puts a mesh together as its file is read.
#pragma once

#include "meshObject.h"

#include <string>

namespace Meshes {

/// Collects a mesh. Faces may name vertices that come later; `finish` finds those that never came.
class MeshBuilder {
  public:
    std::size_t vertexCount() const { return data.vertices.size(); }
    std::size_t texCoordCount() const { return data.texCoords.size(); }
    std::size_t normalCount() const { return data.normals.size(); }

    void addVertex(Mesh::Point vertex);
    void addTexCoord(Mesh::TexCoord texCoord);
    void addNormal(Mesh::Point normal);

    /// Adds a corner to the face that is being read.
    void addCorner(const Mesh::Corner& corner);

    /// The corners of the face that is being read.
    std::span<Mesh::Corner> openFace();

    /// Ends that face. `place` says where it stands in the file ("line 12") when an index in it
    /// turns out to be wrong. Gives up at once when it has fewer than three corners.
    void endFace(const char* unit, std::uint64_t place);

    /// Gives up when a face names something that does not exist; else gives the mesh away.
    MeshData finish();

    /// Numbers begin at this in the format's files, and so in what is said about them.
    void countFrom(unsigned int first) { firstIndex = first; }

  private:
    /// The largest index that was used, and the face that used it first.
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
