// SPDX-License-Identifier: BSL-1.0
/// Reads the header, the counts, and then as many lines as the counts state. The counts only end
/// the loops: they reserve no memory, so a false count ends in a message at the end of the file.
/// Only the header states which values a vertex has, so it is parsed into flags first.
#include "offFormat.h"

#include "examples/mesh/reading/failure.h"
#include "examples/mesh/reading/number.h"
#include "examples/mesh/reading/textReader.h"

#include <cstddef>
#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

namespace Meshes {

namespace {

constexpr TextReader::Rules offRules{.comments = true, .continuations = false};

/// The values of each vertex, as the first word of the file states them: [ST][C][N][4][n]OFF.
struct Header {
    bool texCoords = false;
    bool colours = false;
    bool normals = false;
    bool otherDimension = false;
};

bool takePrefix(std::string_view& word, std::string_view prefix) {
    if (!word.starts_with(prefix))
        return false;
    word.remove_prefix(prefix.size());
    return true;
}

std::optional<Header> parseHeader(std::string_view word) {
    Header header;
    header.texCoords = takePrefix(word, "ST");
    header.colours = takePrefix(word, "C");
    header.normals = takePrefix(word, "N");
    header.otherDimension = takePrefix(word, "4");
    header.otherDimension = takePrefix(word, "n") || header.otherDimension;
    return word == "OFF" ? std::optional(header) : std::nullopt;
}

/// Skips the optional numbers of a colour.
void skipColour(TextReader& text, std::size_t atMost) {
    for (std::size_t count = 0; text.nextWord(); ++count) {
        if (!parseFloat(text.word()))
            text.fail(quoted(text.word()) + " is no number");
        if (count == atMost)
            text.fail(quoted(text.word()) + " is more than this line may have");
    }
}

void nextLine(TextReader& text, std::uint32_t read, std::uint32_t promised, const char* what) {
    if (!text.nextLine())
        text.fail("the file ends after " + std::to_string(read) + " of " +
                  std::to_string(promised) + " " + what);
}

float wordAsNumber(const TextReader& text) {
    const std::optional<float> number = parseFloat(text.word());
    if (!number)
        text.fail(quoted(text.word()) + " is no number for x");
    return *number;
}

void readVertex(TextReader& text, const Header& header, MeshBuilder& mesh) {
    const float x = wordAsNumber(text);
    const float y = text.nextNumber("y");
    mesh.addVertex({x, y, text.nextNumber("z")});
    if (header.normals) {
        const float nx = text.nextNumber("the normal's x");
        const float ny = text.nextNumber("the normal's y");
        mesh.addNormal({nx, ny, text.nextNumber("the normal's z")});
    }
    if (!header.texCoords)
        return skipColour(text, 4);
    if (header.colours)
        for (int component = 0; component < 4; ++component)
            text.nextNumber("the colour");
    const float u = text.nextNumber("u");
    mesh.addTexCoord({u, text.nextNumber("v")});
    text.expectEndOfLine();
}

void readFace(TextReader& text, const Header& header, MeshBuilder& mesh) {
    const std::optional<std::uint32_t> corners = parseUnsigned(text.word());
    if (!corners)
        text.fail(quoted(text.word()) + " is no number of corners");
    for (std::uint32_t count = 0; count < *corners; ++count) {
        const std::uint32_t index = text.nextCount("a vertex");
        if (index == Mesh::absent)
            text.fail("index " + std::to_string(index) + " is too large");
        mesh.addCorner({index, header.texCoords ? index : Mesh::absent,
                        header.normals ? index : Mesh::absent});
    }
    skipColour(text, 4);
    mesh.endFace("line", text.line());
}

Header readHeader(TextReader& text) {
    const std::optional<Header> header = text.nextLine() ? parseHeader(text.word()) : std::nullopt;
    if (!header)
        text.fail("the file does not begin with OFF");
    if (header->otherDimension)
        text.fail(quoted(text.word()) + " has no points of three dimensions, and is not supported");
    return *header;
}

} // namespace

bool OffFormat::recognises(ByteReader& bytes, bool named) const {
    bytes.skipByteOrderMark();
    TextReader text(bytes, offRules);
    if (!text.nextLine() || !parseHeader(text.word()))
        return false;
    if (named)
        return true;
    if (!text.nextWord() && !text.nextLine())
        return false;
    return parseUnsigned(text.word()) || text.word() == "BINARY";
}

void OffFormat::read(ByteReader& bytes, MeshBuilder& mesh) const {
    bytes.skipByteOrderMark();
    TextReader text(bytes, offRules);
    const Header header = readHeader(text);
    if (!text.nextWord() && !text.nextLine())
        text.fail("the file ends before its counts");
    if (text.word() == "BINARY")
        text.fail("the binary form is not supported");
    const std::optional<std::uint32_t> vertices = parseUnsigned(text.word());
    if (!vertices)
        text.fail(quoted(text.word()) + " is no number of vertices");
    const std::uint32_t faces = text.nextCount("the number of faces");
    if (text.nextWord() && !parseUnsigned(text.word()))
        text.fail(quoted(text.word()) + " is no number of edges");
    text.expectEndOfLine();
    for (std::uint32_t count = 0; count < *vertices; ++count) {
        nextLine(text, count, *vertices, "vertices");
        readVertex(text, header, mesh);
    }
    for (std::uint32_t count = 0; count < faces; ++count) {
        nextLine(text, count, faces, "faces");
        readFace(text, header, mesh);
    }
    if (text.nextLine())
        text.fail(quoted(text.word()) + " stands behind the last face");
}

} // namespace Meshes
