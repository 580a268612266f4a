/// The header of a PLY file, which says what the data behind it is made of.
#pragma once

#include "examples/mesh/reading/byteReader.h"

#include <string>
#include <vector>

namespace Meshes {

/// A type of numbers. Each has an old name and one that tells its width.
enum class PlyType { int8, uint8, int16, uint16, int32, uint32, float32, float64 };

std::size_t sizeOf(PlyType type);
bool isInteger(PlyType type);
bool isSigned(PlyType type);

struct PlyProperty {
    std::string name;
    PlyType type = PlyType::int8; ///< of the value, or of each value in the list
    bool isList = false;
    PlyType countType = PlyType::uint8; ///< of the number in front of a list
};

struct PlyElement {
    std::string name;
    std::uint32_t count = 0;
    std::vector<PlyProperty> properties;
};

enum class PlyEncoding { ascii, littleEndian, bigEndian };

struct PlyHeader {
    PlyEncoding encoding = PlyEncoding::ascii;
    std::vector<PlyElement> elements; ///< in the order of their data
    std::uint64_t lines = 0;          ///< how many the header has
};

/// Reads up to the first byte of data. Lines end with LF, CR LF or CR; which, the first one
/// decides. Gives up on whatever the format does not know.
PlyHeader readPlyHeader(ByteReader& bytes);

} // namespace Meshes
