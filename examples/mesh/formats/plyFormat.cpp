// SPDX-License-Identifier: BSL-1.0
/// Reads the elements in the order of the header. The layout of a vertex is computed once, as one
/// role per property, so that the loop over the data compares no names. `PlyValues` hides whether
/// the values are text or binary.
#include "plyFormat.h"

#include "plyValues.h"

#include "examples/mesh/reading/failure.h"

#include <algorithm>
#include <array>
#include <cstddef>
#include <cstdint>
#include <functional>
#include <memory>
#include <span>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

namespace Meshes {

namespace {

// ---- Vertices -------------------------------------------------------------------------------

/// The meaning of a vertex property: an index into the values of a vertex, or `roleCount` for none.
enum Role : std::size_t { X, Y, Z, NormalX, NormalY, NormalZ, U, V, roleCount };

struct RoleName {
    std::string_view name;
    Role role;
};

constexpr std::array<RoleName, 12> roleNames{{{"x", X},
                                              {"y", Y},
                                              {"z", Z},
                                              {"nx", NormalX},
                                              {"ny", NormalY},
                                              {"nz", NormalZ},
                                              {"s", U},
                                              {"t", V},
                                              {"u", U},
                                              {"v", V},
                                              {"texture_u", U},
                                              {"texture_v", V}}};

Role roleOf(const PlyProperty& property) {
    const auto found = std::ranges::find(roleNames, property.name, &RoleName::name);
    return found == roleNames.end() || property.isList ? roleCount : found->role;
}

/// The properties of the vertices of a file.
struct VertexLayout {
    std::vector<Role> roles; ///< of each property
    std::array<bool, roleCount> present{};

    bool hasAll(Role first, Role last) const {
        return std::all_of(present.begin() + first, present.begin() + last + 1,
                           [](bool is) { return is; });
    }
    bool hasNormals() const { return hasAll(NormalX, NormalZ); }
    bool hasTexCoords() const { return hasAll(U, V); }
};

VertexLayout layoutOf(const PlyElement& element) {
    VertexLayout layout;
    for (const PlyProperty& property : element.properties) {
        Role role = roleOf(property);
        if (role != roleCount && layout.present[role])
            role = roleCount; // The first of two properties with the same role counts.
        if (role != roleCount)
            layout.present[role] = true;
        layout.roles.push_back(role);
    }
    return layout;
}

void skipProperty(PlyValues& values, const PlyProperty& property) {
    values.skip(property.type, property.isList ? values.index(property.countType) : 1);
}

void readVertex(PlyValues& values, const PlyElement& element, const VertexLayout& layout,
                MeshBuilder& mesh) {
    std::array<float, roleCount> found{};
    for (std::size_t index = 0; index < element.properties.size(); ++index) {
        const PlyProperty& property = element.properties[index];
        if (layout.roles[index] == roleCount)
            skipProperty(values, property);
        else
            found[layout.roles[index]] = values.number(property.type);
    }
    mesh.addVertex({found[X], found[Y], found[Z]});
    if (layout.hasNormals())
        mesh.addNormal({found[NormalX], found[NormalY], found[NormalZ]});
    if (layout.hasTexCoords())
        mesh.addTexCoord({found[U], found[V]});
}

// ---- Faces ----------------------------------------------------------------------------------

bool isCornerList(const PlyProperty& property) {
    return property.isList && isInteger(property.type) &&
           (property.name == "vertex_indices" || property.name == "vertex_index");
}

void readFace(PlyValues& values, const PlyElement& element, const VertexLayout& layout,
              MeshBuilder& mesh) {
    bool taken = false;
    for (const PlyProperty& property : element.properties) {
        if (taken || !isCornerList(property)) {
            skipProperty(values, property);
            continue;
        }
        taken = true;
        const std::uint32_t corners = values.index(property.countType);
        for (std::uint32_t count = 0; count < corners; ++count) {
            const std::uint32_t index = values.index(property.type);
            mesh.addCorner({index, layout.hasTexCoords() ? index : Mesh::absent,
                            layout.hasNormals() ? index : Mesh::absent});
        }
    }
}

// ---- The file -------------------------------------------------------------------------------

const PlyElement* findElement(const PlyHeader& header, std::string_view name) {
    const auto found = std::ranges::find(header.elements, name, &PlyElement::name);
    return found == header.elements.end() ? nullptr : &*found;
}

void checkHeader(const PlyHeader& header, const VertexLayout& layout) {
    if (!layout.hasAll(X, Z))
        throw ImportFailure{"the header declares no element 'vertex' with x, y and z"};
    const PlyElement* face = findElement(header, "face");
    if (face && face->count > 0 && std::ranges::none_of(face->properties, isCornerList))
        throw ImportFailure{"the header declares faces without a list of vertices"};
}

void readItem(PlyValues& values, const PlyElement& element, const VertexLayout& layout,
              MeshBuilder& mesh) {
    if (element.name == "vertex") {
        readVertex(values, element, layout, mesh);
    } else if (element.name == "face") {
        readFace(values, element, layout, mesh);
        mesh.endFace(values.unit(), values.place());
    } else {
        for (const PlyProperty& property : element.properties)
            skipProperty(values, property);
    }
}

} // namespace

bool PlyFormat::recognises(ByteReader& bytes, bool named) const {
    const std::span<const unsigned char> start = bytes.lookAhead(4);
    constexpr std::string_view blanks = " \t\r\n";
    if (start.size() < 3 || !std::ranges::equal(start.first(3), std::string_view("ply")) ||
        (start.size() == 4 && blanks.find(static_cast<char>(start[3])) == blanks.npos))
        return false;
    if (named)
        return true;
    try {
        readPlyHeader(bytes);
        return true;
    } catch (const ImportFailure&) {
        return false;
    }
}

void PlyFormat::read(ByteReader& bytes, MeshBuilder& mesh) const {
    const PlyHeader header = readPlyHeader(bytes);
    const PlyElement* vertex = findElement(header, "vertex");
    const VertexLayout layout = vertex ? layoutOf(*vertex) : VertexLayout();
    checkHeader(header, layout);
    const std::unique_ptr<PlyValues> values = makePlyValues(header, bytes);
    for (const PlyElement& element : header.elements) {
        // Without properties there is no data. The count may be huge, so the loop must not run.
        const std::uint32_t count = element.properties.empty() ? 0 : element.count;
        for (std::uint32_t index = 0; index < count; ++index) {
            values->beginItem(element, index);
            readItem(*values, element, layout, mesh);
            values->endItem();
        }
    }
    values->expectEnd();
}

} // namespace Meshes
