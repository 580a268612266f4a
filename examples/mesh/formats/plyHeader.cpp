// SPDX-License-Identifier: BSL-1.0
/// Reads the header byte by byte, because binary data may follow at once: no byte after the last
/// line end may be consumed. The header has its own line reader for this reason, with limits on the
/// length of a line and on the number of declarations.
#include "plyHeader.h"

#include "examples/mesh/reading/failure.h"
#include "examples/mesh/reading/number.h"

#include <algorithm>
#include <array>
#include <memory>
#include <optional>
#include <string_view>
#include <utility>

namespace Meshes {

namespace {

struct TypeName {
    std::string_view oldName;
    std::string_view newName;
    std::size_t size;
};

/// In the order of `PlyType`.
constexpr std::array<TypeName, 8> typeNames{{{"char", "int8", 1},
                                             {"uchar", "uint8", 1},
                                             {"short", "int16", 2},
                                             {"ushort", "uint16", 2},
                                             {"int", "int32", 4},
                                             {"uint", "uint32", 4},
                                             {"float", "float32", 4},
                                             {"double", "float64", 8}}};

/// Reads the lines of the header and splits them into words.
class HeaderReader {
  public:
    explicit HeaderReader(ByteReader& bytes) : bytes(bytes) {}

    /// Returns the words of the next line; valid until the next call. Throws `ImportFailure` at the
    /// end of the data.
    const std::vector<std::string>& nextLine();

    std::uint64_t lines() const { return lineNumber; }

    [[noreturn]] void fail(const std::string& what) const {
        throw ImportFailure{"line " + std::to_string(lineNumber) + ": " + what};
    }

  private:
    /// A longer line is an error, except a comment, of which the rest is dropped.
    static constexpr std::size_t longestLine = 4096;

    bool endsLine(int byte);
    void split();
    bool isComment() const { return line.starts_with("comment") || line.starts_with("obj_info"); }

    ByteReader& bytes;
    std::string line;
    std::vector<std::string> words;
    std::uint64_t lineNumber = 0;
    char lineEnd = 0;
};

/// The first line end determines the form of the others: after the last one, a byte of data may
/// look like the second half of a CR LF.
bool HeaderReader::endsLine(int byte) {
    if (lineEnd == 0 && byte == '\r' && bytes.peek() != '\n')
        lineEnd = '\r';
    else if (lineEnd == 0 && byte == '\n')
        lineEnd = '\n';
    return lineEnd != 0 && byte == lineEnd;
}

const std::vector<std::string>& HeaderReader::nextLine() {
    ++lineNumber;
    line.clear();
    for (int byte = bytes.get(); !endsLine(byte); byte = bytes.get()) {
        if (byte == ByteReader::end)
            fail("the file ends inside its header");
        if (line.size() < longestLine)
            line.push_back(static_cast<char>(byte));
        else if (!isComment())
            fail("a header line of more than " + std::to_string(longestLine) + " bytes");
    }
    split();
    return words;
}

void HeaderReader::split() {
    constexpr std::string_view blanks = " \t\r\v\f";
    words.clear();
    std::string_view rest = line;
    while (true) {
        rest.remove_prefix(std::min(rest.find_first_not_of(blanks), rest.size()));
        if (rest.empty())
            return;
        const std::size_t end = std::min(rest.find_first_of(blanks), rest.size());
        words.emplace_back(rest.substr(0, end));
        rest.remove_prefix(end);
    }
}

PlyType parseType(const HeaderReader& reader, std::string_view word) {
    for (std::size_t index = 0; index < typeNames.size(); ++index)
        if (word == typeNames[index].oldName || word == typeNames[index].newName)
            return static_cast<PlyType>(index);
    reader.fail(quoted(word) + " is no type");
}

PlyEncoding parseEncoding(const HeaderReader& reader, const std::vector<std::string>& words) {
    if (words.size() != 3 || words[0] != "format")
        reader.fail("'format' with an encoding and a version is missing");
    if (words[2] != "1.0")
        reader.fail("version " + quoted(words[2]) + " is not supported");
    if (words[1] == "ascii")
        return PlyEncoding::ascii;
    if (words[1] == "binary_little_endian")
        return PlyEncoding::littleEndian;
    if (words[1] == "binary_big_endian")
        return PlyEncoding::bigEndian;
    reader.fail(quoted(words[1]) + " is no encoding");
}

PlyElement parseElement(const HeaderReader& reader, const std::vector<std::string>& words) {
    const std::optional<std::uint32_t> count =
        words.size() == 3 ? parseUnsigned(words[2]) : std::nullopt;
    if (!count)
        reader.fail("'element' without a name and a count");
    return {words[1], *count, {}};
}

PlyProperty parseProperty(const HeaderReader& reader, const std::vector<std::string>& words) {
    if (words.size() == 3)
        return {words[2], parseType(reader, words[1]), false, PlyType::uint8};
    if (words.size() != 5 || words[1] != "list")
        reader.fail("'property' without a type and a name");
    const PlyProperty property{words[4], parseType(reader, words[3]), true,
                               parseType(reader, words[2])};
    if (!isInteger(property.countType))
        reader.fail("a list cannot be counted by " + quoted(words[2]));
    return property;
}

template <class T>
void addNamed(const HeaderReader& reader, std::vector<T>& list, T added) {
    constexpr std::size_t most = 1000; // Few enough for a linear search.
    if (list.size() == most)
        reader.fail("more than " + std::to_string(most) + " of one kind");
    if (std::ranges::find(list, added.name, &T::name) != list.end())
        reader.fail(quoted(added.name) + " is there twice");
    list.push_back(std::move(added));
}

/// Adds the declaration in a line to the header.
void readDeclaration(const HeaderReader& reader, const std::vector<std::string>& words,
                     PlyHeader& header) {
    if (words[0] == "element") {
        addNamed(reader, header.elements, parseElement(reader, words));
    } else if (words[0] == "property") {
        if (header.elements.empty())
            reader.fail("'property' before the first element");
        addNamed(reader, header.elements.back().properties, parseProperty(reader, words));
    } else {
        reader.fail(quoted(words[0]) + " begins no line of the header");
    }
}

bool saysNothing(const std::vector<std::string>& words) {
    return words.empty() || words[0] == "comment" || words[0] == "obj_info";
}

} // namespace

std::size_t sizeOf(PlyType type) {
    return typeNames[static_cast<std::size_t>(type)].size;
}

bool isInteger(PlyType type) {
    return type != PlyType::float32 && type != PlyType::float64;
}

bool isSigned(PlyType type) {
    return type == PlyType::int8 || type == PlyType::int16 || type == PlyType::int32;
}

PlyHeader readPlyHeader(ByteReader& bytes) {
    HeaderReader reader(bytes);
    PlyHeader header;
    if (reader.nextLine() != std::vector<std::string>{"ply"})
        reader.fail("the file does not begin with 'ply'");
    bool formatKnown = false;
    while (true) {
        const std::vector<std::string>& words = reader.nextLine();
        if (saysNothing(words))
            continue;
        if (words[0] == "end_header" && formatKnown)
            break;
        if (formatKnown) {
            readDeclaration(reader, words, header);
        } else {
            header.encoding = parseEncoding(reader, words);
            formatKnown = true;
        }
    }
    header.lines = reader.lines();
    return header;
}

} // namespace Meshes
