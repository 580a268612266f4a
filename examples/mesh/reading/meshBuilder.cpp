// SPDX-License-Identifier: BSL-1.0
/// Checks indices once, at the end: for each kind of element it remembers the largest index and the
/// first face that used it. That costs one comparison per corner, needs no second pass over the
/// faces, and still names the position of the fault.
#include "meshBuilder.h"

#include "failure.h"

#include <algorithm>
#include <string>
#include <utility>

namespace Meshes {

namespace {

/// Appends to a list whose indices have 32 bits. The largest index is `Mesh::absent`.
template <class T>
void append(std::vector<T>& list, const T& element) {
    if (list.size() >= Mesh::absent)
        throw ImportFailure{"more than 4294967295 elements of one kind"};
    list.push_back(element);
}

} // namespace

void MeshBuilder::addVertex(Mesh::Point vertex) {
    append(data.vertices, vertex);
}

void MeshBuilder::addTexCoord(Mesh::TexCoord texCoord) {
    append(data.texCoords, texCoord);
}

void MeshBuilder::addNormal(Mesh::Point normal) {
    append(data.normals, normal);
}

void MeshBuilder::addCorner(const Mesh::Corner& corner) {
    data.corners.push_back(corner);
    ++openCorners;
}

std::span<Mesh::Corner> MeshBuilder::openFace() {
    return std::span(data.corners).last(openCorners);
}

void MeshBuilder::endFace(const char* unit, std::uint64_t place) {
    if (openCorners < 3)
        throw ImportFailure{std::string(unit) + " " + std::to_string(place) +
                            ": a face needs three corners or more, not " +
                            std::to_string(openCorners)};
    for (const Mesh::Corner& corner : openFace()) {
        note(largestVertex, corner.vertex, unit, place);
        if (corner.texCoord != Mesh::absent)
            note(largestTexCoord, corner.texCoord, unit, place);
        if (corner.normal != Mesh::absent)
            note(largestNormal, corner.normal, unit, place);
    }
    data.faceEnds.push_back(data.corners.size());
    openCorners = 0;
}

void MeshBuilder::note(Largest& largest, std::uint32_t index, const char* unit,
                       std::uint64_t place) {
    if (largest.index < static_cast<std::int64_t>(index))
        largest = {index, unit, place};
}

void MeshBuilder::check(const Largest& largest, std::size_t count, const char* what) const {
    if (largest.index >= static_cast<std::int64_t>(count))
        throw ImportFailure{std::string(largest.unit) + " " + std::to_string(largest.place) +
                            ": the face refers to " + what + " " +
                            std::to_string(largest.index + firstIndex) + ", but there are only " +
                            std::to_string(count)};
}

MeshData MeshBuilder::finish() {
    check(largestVertex, data.vertices.size(), "vertex");
    check(largestTexCoord, data.texCoords.size(), "texture coordinate");
    check(largestNormal, data.normals.size(), "normal");
    return std::move(data);
}

} // namespace Meshes
