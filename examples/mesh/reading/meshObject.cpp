// SPDX-License-Identifier: BSL-1.0
/// Stores a mesh as lists of plain values, each with its count, in blocks: one stream call per 1024
/// elements instead of one per value. Reading trusts no count: lists grow as blocks arrive, every
/// value and index is checked, and the object is changed only when the whole mesh is valid.
#include "meshObject.h"

#include "components/objectIO/objectIO.h"

#include <array>
#include <bit>
#include <cmath>
#include <functional>
#include <limits>
#include <type_traits>
#include <utility>

using namespace Mz;

namespace Meshes {

namespace {

constexpr const char* source = "examples/mesh/reading/meshObject";

[[noreturn]] void fail(int line, const char* what) {
    throw QrStreamEx::ExReadError(source, line, what);
}

/// The number of elements in a block.
constexpr std::size_t blockSize = 1024;

/// The type of the values of which an element of a list consists.
template <class Element>
using ValueOf = std::conditional_t<std::is_same_v<Element, Mesh::Corner>, unsigned int, float>;
template <class Element>
constexpr std::size_t valueCount = sizeof(Element) / sizeof(ValueOf<Element>);
template <class Element>
using Values = std::array<ValueOf<Element>, valueCount<Element>>;

void writeCount(QrStream& stream, std::size_t count) {
    if (count > std::numeric_limits<unsigned int>::max())
        throw QrStreamEx::ExWriteError(source, __LINE__, "the mesh is too large");
    stream << static_cast<unsigned int>(count);
}

/// Writes the elements without their count.
template <class Element>
void writeElements(QrStream& stream, std::span<const Element> elements) {
    std::array<ValueOf<Element>, blockSize * valueCount<Element>> block;
    while (!elements.empty()) {
        const std::span now = elements.first(std::min(elements.size(), blockSize));
        auto* at = block.data();
        for (const Element& element : now)
            at = std::ranges::copy(std::bit_cast<Values<Element>>(element), at).out;
        stream.write(block[0], static_cast<int>(at - block.data()));
        elements = elements.subspan(now.size());
    }
}

template <class Element>
void writeList(QrStream& stream, const std::vector<Element>& elements) {
    writeCount(stream, elements.size());
    writeElements<Element>(stream, elements);
}

/// Appends `count` elements as they arrive. The count is not trusted: it reserves no memory.
template <class Element>
void readElements(QrStream& stream, std::vector<Element>& elements, std::size_t count) {
    std::array<ValueOf<Element>, blockSize * valueCount<Element>> block;
    while (count > 0) {
        const std::size_t now = std::min(count, blockSize);
        const auto wanted = static_cast<int>(now * valueCount<Element>);
        if (stream.read(block[0], wanted) != wanted)
            fail(__LINE__, "the mesh ends too early");
        for (std::size_t index = 0; index < now; ++index) {
            Values<Element> values;
            std::copy_n(block.data() + index * values.size(), values.size(), values.data());
            elements.push_back(std::bit_cast<Element>(values));
        }
        count -= now;
    }
}

template <class Element>
std::vector<Element> readList(QrStream& stream) {
    unsigned int count = 0;
    stream >> count;
    std::vector<Element> elements;
    readElements(stream, elements, count);
    const auto isFinite = [](const Element& element) {
        return std::ranges::all_of(std::bit_cast<Values<Element>>(element),
                                   [](float value) { return std::isfinite(value); });
    };
    if (!std::ranges::all_of(elements, isFinite))
        fail(__LINE__, "a value of the mesh is not finite");
    return elements;
}

/// Writes the number of faces and, for each, the number of its corners and the corners.
void writeFaces(QrStream& stream, const Mesh& mesh) {
    writeCount(stream, mesh.faceCount());
    for (std::size_t index = 0; index < mesh.faceCount(); ++index) {
        writeCount(stream, mesh.face(index).size());
        writeElements(stream, mesh.face(index));
    }
}

void readFaces(QrStream& stream, MeshData& data) {
    unsigned int count = 0;
    stream >> count;
    for (; count > 0; --count) {
        unsigned int corners = 0;
        stream >> corners;
        if (corners < 3)
            fail(__LINE__, "a face of the mesh has fewer than three corners");
        readElements(stream, data.corners, corners);
        data.faceEnds.push_back(data.corners.size());
    }
    const auto isSound = [&](const Mesh::Corner& corner) {
        return corner.vertex < data.vertices.size() &&
               (corner.texCoord == Mesh::absent || corner.texCoord < data.texCoords.size()) &&
               (corner.normal == Mesh::absent || corner.normal < data.normals.size());
    };
    if (!std::ranges::all_of(data.corners, isSound))
        fail(__LINE__, "a face of the mesh refers to what is not there");
}

Mesh::Box boundsOf(std::span<const Mesh::Point> points) {
    if (points.empty())
        return {};
    Mesh::Box result{points[0], points[0]};
    for (const Mesh::Point& point : points) {
        result.low = {std::min(result.low.x, point.x), std::min(result.low.y, point.y),
                      std::min(result.low.z, point.z)};
        result.high = {std::max(result.high.x, point.x), std::max(result.high.y, point.y),
                       std::max(result.high.z, point.z)};
    }
    return result;
}

} // namespace

MeshObject::MeshObject(MeshData meshData, const wchar_t* formatLabel)
    : data(std::move(meshData)), label(formatLabel), box(boundsOf(data.vertices)) {}

QrRef<QrCastable> MeshObject::make(MeshData data, const wchar_t* formatLabel) {
    const QrPtr<MeshObject> mesh(new MeshObject(std::move(data), formatLabel));
    return mesh->getCastable();
}

std::span<const Mesh::Corner> MeshObject::face(std::size_t index) const {
    const std::size_t begin = index == 0 ? 0 : data.faceEnds[index - 1];
    return std::span(data.corners).subspan(begin, data.faceEnds[index] - begin);
}

void MeshObject::write(QrStream& stream) {
    QrWriteExactText(stream, label);
    writeList(stream, data.vertices);
    writeList(stream, data.texCoords);
    writeList(stream, data.normals);
    writeFaces(stream, *this);
}

void MeshObject::read(QrStream& stream) {
    std::wstring newLabel = QrReadExactText(stream);
    MeshData newData;
    newData.vertices = readList<Point>(stream);
    newData.texCoords = readList<TexCoord>(stream);
    newData.normals = readList<Point>(stream);
    readFaces(stream, newData);
    label = std::move(newLabel);
    data = std::move(newData);
    box = boundsOf(data.vertices);
}

} // namespace Meshes
