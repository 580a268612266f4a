// SPDX-License-Identifier: BSL-1.0
/// Reads one statement per line, in one pass. Indices are converted to absolute ones at once, since
/// negative ones depend on the number of elements read so far; whether an index is too large is
/// known only at the end, when `MeshBuilder` checks it. Unknown statements are errors, and not
/// skipped, so that a file of another format is not taken for an empty mesh.
#include "objFormat.h"

#include "examples/mesh/reading/failure.h"
#include "examples/mesh/reading/number.h"
#include "examples/mesh/reading/textReader.h"

#include <algorithm>
#include <array>
#include <cstddef>
#include <cstdint>
#include <functional>
#include <optional>
#include <string>
#include <string_view>
#include <utility>

namespace Meshes {

namespace {

constexpr TextReader::Rules objRules{.comments = true, .continuations = true};

/// The statements of the format that do not concern polygons. They are skipped.
constexpr std::array<std::string_view, 40> otherStatements{
    "g",         "o",      "s",     "usemtl",   "mtllib",   "p",      "l",      "vp",
    "mg",        "lod",    "bevel", "c_interp", "d_interp", "usemap", "maplib", "shadow_obj",
    "trace_obj", "cstype", "deg",   "bmat",     "step",     "curv",   "curv2",  "surf",
    "parm",      "trim",   "hole",  "scrv",     "sp",       "end",    "con",    "ctech",
    "stech",     "bzp",    "bsp",   "cdc",      "cdp",      "res",    "bd",     "fo"};

bool isOtherStatement(std::string_view word) {
    return std::ranges::find(otherStatements, word) != otherStatements.end();
}

/// Returns the index that `digits` names, from 0. `count` is the number of elements read so far.
std::uint32_t readIndex(const TextReader& text, std::string_view digits, std::size_t count) {
    const std::optional<std::int64_t> number = parseInteger(digits);
    if (!number)
        text.fail(quoted(digits) + " in " + quoted(text.word()) + " is no index");
    if (*number == 0)
        text.fail("index 0 in " + quoted(text.word()) + "; indices begin at 1");
    const std::int64_t index =
        *number > 0 ? *number - 1 : static_cast<std::int64_t>(count) + *number;
    if (index < 0)
        text.fail("index " + std::to_string(*number) + " reaches back before the first of " +
                  std::to_string(count) + " elements");
    if (index >= static_cast<std::int64_t>(Mesh::absent))
        text.fail("index " + std::to_string(*number) + " is too large");
    return static_cast<std::uint32_t>(index);
}

/// Reads a corner in one of the forms a, a/b, a//c and a/b/c.
Mesh::Corner readCorner(const TextReader& text, const MeshBuilder& mesh) {
    const std::string_view word = text.word();
    const std::size_t slash = std::min(word.find('/'), word.size());
    Mesh::Corner corner{readIndex(text, word.substr(0, slash), mesh.vertexCount())};
    if (slash == word.size())
        return corner;
    const std::string_view rest = word.substr(slash + 1);
    const std::size_t second = std::min(rest.find('/'), rest.size());
    const bool hasNormal = second != rest.size();
    if (second != 0 || !hasNormal)
        corner.texCoord = readIndex(text, rest.substr(0, second), mesh.texCoordCount());
    if (hasNormal)
        corner.normal = readIndex(text, rest.substr(second + 1), mesh.normalCount());
    return corner;
}

void readFace(TextReader& text, MeshBuilder& mesh) {
    const std::uint64_t line = text.line();
    while (text.nextWord())
        mesh.addCorner(readCorner(text, mesh));
    mesh.endFace("line", line);
}

Mesh::Point readPoint(TextReader& text) {
    const float x = text.nextNumber("x");
    const float y = text.nextNumber("y");
    return {x, y, text.nextNumber("z")};
}

/// Skips up to `count` optional numbers. Anything else on the line is an error.
void skipNumbers(TextReader& text, int count) {
    while (text.nextWord()) {
        if (!parseFloat(text.word()))
            text.fail(quoted(text.word()) + " is no number");
        if (--count < 0)
            text.fail(quoted(text.word()) + " is more than this line may have");
    }
}

void readTexCoord(TextReader& text, MeshBuilder& mesh) {
    const float u = text.nextNumber("u");
    if (!text.nextWord())
        return mesh.addTexCoord({u, 0.0F});
    const std::optional<float> v = parseFloat(text.word());
    if (!v)
        text.fail(quoted(text.word()) + " is no number for v");
    mesh.addTexCoord({u, *v});
    skipNumbers(text, 1);
}

void readStatement(TextReader& text, MeshBuilder& mesh) {
    const std::string_view keyword = text.word();
    if (keyword == "v") {
        mesh.addVertex(readPoint(text));
        skipNumbers(text, 5); // An optional weight, colour, or both.
    } else if (keyword == "vn") {
        mesh.addNormal(readPoint(text));
        skipNumbers(text, 0);
    } else if (keyword == "vt") {
        readTexCoord(text, mesh);
    } else if (keyword == "f") {
        readFace(text, mesh);
    } else if (!isOtherStatement(keyword)) {
        text.fail(quoted(keyword) + " begins no statement");
    }
}

bool hasThreeNumbers(TextReader& text) {
    for (int count = 0; count < 3; ++count)
        if (!text.nextWord() || !parseFloat(text.word()))
            return false;
    return true;
}

} // namespace

bool ObjFormat::recognises(ByteReader& bytes, bool named) const {
    constexpr int statementsSeen = 64;
    bytes.skipByteOrderMark();
    TextReader text(bytes, objRules);
    for (int count = 0; count < statementsSeen; ++count) {
        if (!text.nextLine())
            return false;
        const std::string_view keyword = text.word();
        const bool isVertex = keyword == "v";
        if (!isVertex && keyword != "vt" && keyword != "vn" && keyword != "f" &&
            !isOtherStatement(keyword))
            return false;
        if (named)
            return true;
        if (isVertex)
            return hasThreeNumbers(text);
    }
    return false;
}

void ObjFormat::read(ByteReader& bytes, MeshBuilder& mesh) const {
    mesh.countFrom(1);
    bytes.skipByteOrderMark();
    TextReader text(bytes, objRules);
    while (text.nextLine())
        readStatement(text, mesh);
}

} // namespace Meshes
