// SPDX-License-Identifier: BSL-1.0
/// Decides between text and binary first by the size of the data, which binary files state, and
/// then by NUL bytes in the header; the word "solid" proves nothing, since binary files may begin
/// with it too. A hash map from coordinates to indices joins equal points while they are read.
#include "stlFormat.h"

#include "examples/mesh/reading/binaryValue.h"
#include "examples/mesh/reading/failure.h"
#include "examples/mesh/reading/number.h"
#include "examples/mesh/reading/textReader.h"

#include <algorithm>
#include <array>
#include <bit>
#include <cmath>
#include <cstddef>
#include <cstdint>
#include <functional>
#include <initializer_list>
#include <optional>
#include <span>
#include <string>
#include <string_view>
#include <unordered_map>
#include <utility>

namespace Meshes {

namespace {

constexpr TextReader::Rules stlRules{.comments = false, .continuations = false};

constexpr std::size_t titleSize = 80;
constexpr std::size_t headerSize = 84;
constexpr std::size_t facetSize = 50;

/// Maps points with equal coordinates to one vertex of the mesh.
class Welder {
  public:
    explicit Welder(MeshBuilder& mesh) : mesh(mesh) {}

    std::uint32_t vertexOf(const Mesh::Point& point) {
        const auto next = static_cast<std::uint32_t>(mesh.vertexCount());
        const auto [entry, isNew] = indices.try_emplace(point, next);
        if (isNew)
            mesh.addVertex(point);
        return entry->second;
    }

  private:
    struct Hash {
        std::size_t operator()(const Mesh::Point& point) const {
            std::uint64_t hash = 0;
            for (const float coordinate : {point.x, point.y, point.z}) {
                // +0 and -0 are equal, so they need one hash.
                const auto bits = std::bit_cast<std::uint32_t>(coordinate + 0.0F);
                hash = (hash ^ bits) * 0x9E3779B97F4A7C15U;
                hash ^= hash >> 29;
            }
            return static_cast<std::size_t>(hash);
        }
    };

    MeshBuilder& mesh;
    std::unordered_map<Mesh::Point, std::uint32_t, Hash> indices;
};

// ---- Which form -----------------------------------------------------------------------------

std::uint64_t binarySize(std::uint64_t facets) {
    return headerSize + facetSize * facets;
}

/// Returns whether the size is exactly that of the count of facets. No text passes this test: four
/// characters of text, read as the count, mean more than 25 gigabytes.
bool hasBinarySize(ByteReader& bytes) {
    const std::span<const unsigned char> header = bytes.lookAhead(headerSize);
    return header.size() == headerSize && bytes.size() &&
           *bytes.size() == binarySize(unsignedValue(header.subspan(titleSize), false));
}

/// Returns whether the header contains a NUL. Text has none there; a binary header has one as a
/// rule, after the title or in the upper bytes of the count.
bool hasBinaryHeader(ByteReader& bytes) {
    const std::span<const unsigned char> header = bytes.lookAhead(headerSize);
    return std::ranges::find(header, 0) != header.end();
}

bool isWord(std::string_view word, std::string_view keyword) {
    const auto lower = [](char c) { return c >= 'A' && c <= 'Z' ? static_cast<char>(c + 32) : c; };
    return std::ranges::equal(word, keyword, {}, lower);
}

/// Returns whether `word` is a keyword or the beginning of one, as in truncated data.
bool beginsKeyword(std::string_view word) {
    const auto begins = [&](std::string_view keyword) {
        return isWord(word, keyword.substr(0, word.size()));
    };
    return begins("facet") || begins("endsolid");
}

bool beginsAsText(ByteReader& bytes) {
    bytes.skipByteOrderMark();
    const std::span<const unsigned char> start = bytes.lookAhead(titleSize);
    const auto word = std::ranges::find_if_not(
        start, [](int byte) { return byte == ' ' || (byte >= '\t' && byte <= '\r'); });
    std::string text(word, start.end());
    text.resize(std::min<std::size_t>(text.size(), 5));
    return isWord(text, "solid");
}

// ---- Text -----------------------------------------------------------------------------------

void expectLine(TextReader& text, std::string_view keyword) {
    if (!text.nextLine())
        text.fail("the file ends before " + quoted(keyword));
    if (!isWord(text.word(), keyword))
        text.fail(quoted(keyword) + " is missing before " + quoted(text.word()));
}

void expectWord(TextReader& text, std::string_view keyword) {
    if (!text.nextWord() || !isWord(text.word(), keyword))
        text.fail("the line lacks the word " + quoted(keyword));
}

/// Skips a normal, which is not-a-number for some facets without an area.
void skipNormal(TextReader& text) {
    expectWord(text, "normal");
    for (int count = 0; count < 3; ++count) {
        if (!text.nextWord())
            text.fail("the line ends inside the normal");
        if (!isNumber(text.word()))
            text.fail(quoted(text.word()) + " is no number for the normal");
    }
    text.expectEndOfLine();
}

Mesh::Point readTextPoint(TextReader& text) {
    expectLine(text, "vertex");
    const float x = text.nextNumber("x");
    const float y = text.nextNumber("y");
    const Mesh::Point point{x, y, text.nextNumber("z")};
    text.expectEndOfLine();
    return point;
}

/// Reads the rest of a facet, after its keyword.
void readTextFacet(TextReader& text, Welder& welder, MeshBuilder& mesh) {
    const std::uint64_t line = text.line();
    skipNormal(text);
    expectLine(text, "outer");
    expectWord(text, "loop");
    text.expectEndOfLine();
    for (int count = 0; count < 3; ++count)
        mesh.addCorner({welder.vertexOf(readTextPoint(text))});
    expectLine(text, "endloop");
    text.expectEndOfLine();
    expectLine(text, "endfacet");
    text.expectEndOfLine();
    mesh.endFace("line", line);
}

void readTextSolid(TextReader& text, Welder& welder, MeshBuilder& mesh) {
    if (!isWord(text.word(), "solid"))
        text.fail("'solid' is missing before " + quoted(text.word()));
    while (text.nextLine()) {
        if (isWord(text.word(), "endsolid"))
            return;
        if (!isWord(text.word(), "facet"))
            text.fail(quoted(text.word()) + " begins neither a facet nor the solid's end");
        readTextFacet(text, welder, mesh);
    }
    text.fail("the file ends without 'endsolid'");
}

void readText(ByteReader& bytes, MeshBuilder& mesh) {
    TextReader text(bytes, stlRules);
    Welder welder(mesh);
    if (!text.nextLine())
        text.fail("the file is empty");
    do
        readTextSolid(text, welder, mesh);
    while (text.nextLine());
}

// ---- Binary ---------------------------------------------------------------------------------

Mesh::Point readBinaryPoint(std::span<const unsigned char> data, std::uint64_t offset) {
    const Mesh::Point point{floatValue(data.subspan(0, 4), false),
                            floatValue(data.subspan(4, 4), false),
                            floatValue(data.subspan(8, 4), false)};
    if (!std::isfinite(point.x) || !std::isfinite(point.y) || !std::isfinite(point.z))
        ByteReader::fail(offset, "a coordinate is not finite");
    return point;
}

void readBinaryFacet(ByteReader& bytes, Welder& welder, MeshBuilder& mesh) {
    const std::uint64_t offset = bytes.offset();
    std::array<unsigned char, facetSize> facet;
    if (bytes.read(facet) < facet.size())
        ByteReader::fail(offset, "the file ends inside this facet");
    constexpr std::size_t pointSize = 12;
    for (std::size_t begin = pointSize; begin <= 3 * pointSize; begin += pointSize) {
        const auto data = std::span<const unsigned char>(facet).subspan(begin, pointSize);
        mesh.addCorner({welder.vertexOf(readBinaryPoint(data, offset + begin))});
    }
    mesh.endFace("byte", offset);
}

void readBinary(ByteReader& bytes, MeshBuilder& mesh) {
    std::array<unsigned char, headerSize> header;
    if (bytes.read(header) < header.size())
        ByteReader::fail(0, "the file ends inside its header of 84 bytes");
    const auto count = std::span<const unsigned char>(header).subspan(titleSize);
    const std::uint64_t facets = unsignedValue(count, false);
    if (bytes.size() && *bytes.size() != binarySize(facets))
        ByteReader::fail(titleSize, std::to_string(facets) + " facets would make a file of " +
                                        std::to_string(binarySize(facets)) + " bytes, but it has " +
                                        std::to_string(*bytes.size()));
    Welder welder(mesh);
    for (std::uint64_t facet = 0; facet < facets; ++facet)
        readBinaryFacet(bytes, welder, mesh);
    if (bytes.peek() != ByteReader::end)
        ByteReader::fail(bytes.offset(), "there is more data than facets");
}

} // namespace

bool StlFormat::recognises(ByteReader& bytes, bool named) const {
    if (hasBinarySize(bytes))
        return true;
    const bool binaryHeader = hasBinaryHeader(bytes);
    const std::span<const unsigned char> start = bytes.lookAhead(3);
    const bool isPly = std::ranges::equal(start, std::string_view("ply"));
    if (binaryHeader)
        return named && !isPly;
    if (!beginsAsText(bytes))
        return false;
    TextReader text(bytes, stlRules);
    if (!text.nextLine() || !isWord(text.word(), "solid"))
        return false;
    if (!text.nextLine())
        return named;
    const bool keyword = isWord(text.word(), "facet") || isWord(text.word(), "endsolid");
    return keyword || (named && bytes.peek() == ByteReader::end && beginsKeyword(text.word()));
}

void StlFormat::read(ByteReader& bytes, MeshBuilder& mesh) const {
    if (hasBinarySize(bytes) || hasBinaryHeader(bytes) || !beginsAsText(bytes))
        readBinary(bytes, mesh);
    else
        readText(bytes, mesh);
}

} // namespace Meshes
