#include "meshBuilder.h"

#include "failure.h"

#include <algorithm>
#include <utility>

namespace Meshes {

namespace {

class MeshObject final : public Mz::QrCastRef<Mz::QrCastHeap<Mz::QrCastImpl<MeshObject, Mesh>>> {
  public:
    MeshObject(MeshData meshData, const wchar_t* label)
        : data(std::move(meshData)), label(label), box(boundsOf(data.vertices)) {}

    const wchar_t* formatLabel() const override { return label; }
    std::span<const Point> vertices() const override { return data.vertices; }
    std::span<const TexCoord> texCoords() const override { return data.texCoords; }
    std::span<const Point> normals() const override { return data.normals; }
    std::size_t faceCount() const override { return data.faceEnds.size(); }
    std::span<const Corner> face(std::size_t index) const override {
        const std::size_t begin = index == 0 ? 0 : data.faceEnds[index - 1];
        return std::span(data.corners).subspan(begin, data.faceEnds[index] - begin);
    }
    Box bounds() const override { return box; }

  private:
    static Box boundsOf(std::span<const Point> points) {
        if (points.empty())
            return {};
        Box result{points[0], points[0]};
        for (const Point& point : points) {
            result.low = {std::min(result.low.x, point.x), std::min(result.low.y, point.y),
                          std::min(result.low.z, point.z)};
            result.high = {std::max(result.high.x, point.x), std::max(result.high.y, point.y),
                           std::max(result.high.z, point.z)};
        }
        return result;
    }

    MeshData data;
    const wchar_t* label;
    Box box;
};

/// Adds to one of the lists whose indices are 32 bits wide, the largest of which means none.
template <class T>
void append(std::vector<T>& list, const T& element) {
    if (list.size() >= Mesh::absent)
        throw ImportFailure{"more than 4294967295 elements of one kind"};
    list.push_back(element);
}

} // namespace

Mz::QrRef<Mz::QrCastable> makeMesh(MeshData data, const wchar_t* formatLabel) {
    return new MeshObject(std::move(data), formatLabel);
}

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
