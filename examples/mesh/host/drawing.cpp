// SPDX-License-Identifier: BSL-1.0
/// Projects the vertices, sorts the faces by depth and writes one polygon for each. All constants
/// of the view are plain numbers: the sine and cosine of two systems may differ in the last digit.
#include "drawing.h"

#include "components/componentManager/files.h"

#include <algorithm>
#include <charconv>
#include <cmath>
#include <ostream>
#include <string>
#include <utility>
#include <vector>

namespace Meshes {

namespace {

constexpr std::size_t mostFaces = 20000;
constexpr double pictureSize = 200;

/// A vertex on the picture, in its unit; `depth` grows towards the viewer.
struct Projected {
    double x, y, depth;
};

/// The view: turned about the vertical axis, then tilted, and scaled to fill the picture.
class View {
  public:
    explicit View(const Mesh& mesh) {
        const Mesh::Box box = mesh.bounds();
        middle = {(box.low.x + box.high.x) / 2, (box.low.y + box.high.y) / 2,
                  (box.low.z + box.high.z) / 2};
        const double x = box.high.x - box.low.x, y = box.high.y - box.low.y,
                     z = box.high.z - box.low.z;
        const double diagonal = std::sqrt(x * x + y * y + z * z);
        scale = diagonal > 0 && std::isfinite(diagonal) ? pictureSize * 0.9 / diagonal : 0;
    }

    Projected operator()(const Mesh::Point& point) const {
        const double x = point.x - middle.x, y = point.y - middle.y, z = point.z - middle.z;
        const double turned = 0.8 * x - 0.6 * y, away = 0.6 * x + 0.8 * y;
        const double up = 0.28 * away + 0.96 * z, near = 0.28 * z - 0.96 * away;
        return {pictureSize / 2 + scale * turned, pictureSize / 2 - scale * up, scale * near};
    }

  private:
    struct {
        double x, y, z;
    } middle{};
    double scale = 0;
};

struct Face {
    std::size_t index;
    double depth; ///< of its middle
};

/// Returns the faces to draw, the farthest first.
std::vector<Face> sortedFaces(const Mesh& mesh, const std::vector<Projected>& vertices) {
    std::vector<Face> faces;
    faces.reserve(mesh.faceCount());
    for (std::size_t index = 0; index < mesh.faceCount(); ++index) {
        double depth = 0;
        const auto corners = mesh.face(index);
        for (const Mesh::Corner& corner : corners)
            depth += vertices[corner.vertex].depth;
        faces.push_back({index, depth / static_cast<double>(corners.size())});
    }
    std::stable_sort(faces.begin(), faces.end(),
                     [](const Face& a, const Face& b) { return a.depth < b.depth; });
    if (faces.size() > mostFaces)
        faces.erase(faces.begin(), faces.end() - static_cast<std::ptrdiff_t>(mostFaces));
    return faces;
}

/// Returns how much of the face the viewer sees, from 0 (its edge) to 1.
double facing(const Projected& a, const Projected& b, const Projected& c) {
    const double x1 = b.x - a.x, y1 = b.y - a.y, z1 = b.depth - a.depth;
    const double x2 = c.x - a.x, y2 = c.y - a.y, z2 = c.depth - a.depth;
    const double x = y1 * z2 - z1 * y2, y = z1 * x2 - x1 * z2, z = x1 * y2 - y1 * x2;
    const double length = std::sqrt(x * x + y * y + z * z);
    return length > 0 ? std::abs(z) / length : 0;
}

void append(std::string& text, double number) {
    char digits[64];
    const auto end =
        std::to_chars(digits, digits + sizeof digits, number, std::chars_format::fixed, 1).ptr;
    text.append(digits, end);
}

void append(std::string& text, const Mesh& mesh, const Face& face,
            const std::vector<Projected>& vertices) {
    const auto corners = mesh.face(face.index);
    const double light = facing(vertices[corners[0].vertex], vertices[corners[1].vertex],
                                vertices[corners[2].vertex]);
    text += "<polygon fill=\"hsl(210,45%,";
    append(text, 30 + 45 * light);
    text += "%)\" points=\"";
    for (const Mesh::Corner& corner : corners) {
        append(text, vertices[corner.vertex].x);
        text += ',';
        append(text, vertices[corner.vertex].y);
        text += ' ';
    }
    text.back() = '"';
    text += "/>\n";
}

} // namespace

void draw(const Mesh& mesh, const std::filesystem::path& file) {
    const View view(mesh);
    std::vector<Projected> vertices;
    vertices.reserve(mesh.vertexCount());
    for (const Mesh::Point& point : mesh.vertices())
        vertices.push_back(view(point));
    std::string text = "<svg xmlns=\"http://www.w3.org/2000/svg\" viewBox=\"0 0 200 200\""
                       " stroke=\"#333\" stroke-width=\"0.4\" stroke-linejoin=\"round\">\n";
    for (const Face& face : sortedFaces(mesh, vertices))
        append(text, mesh, face, vertices);
    text += "</svg>\n";
    Mz::replaceFile(file, [&](std::ostream& stream) { stream << text; });
}

} // namespace Meshes
