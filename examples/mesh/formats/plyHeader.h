// SPDX-License-Identifier: BSL-1.0
/// The header of a PLY file, which declares the layout of the data after it.
#pragma once

#include "examples/mesh/reading/byteReader.h"

#include <cstddef>
#include <cstdint>
#include <string>
#include <vector>

namespace Meshes {

/// A numeric type. Each has an old name in files and a new one with its width.
enum class PlyType { int8, uint8, int16, uint16, int32, uint32, float32, float64 };

/// Returns the size of a value in bytes.
std::size_t sizeOf(PlyType type);
bool isInteger(PlyType type);
bool isSigned(PlyType type);

struct PlyProperty {
    std::string name;
    PlyType type = PlyType::int8; ///< of the value, or of each value in the list
    bool isList = false;
    PlyType countType = PlyType::uint8; ///< of the length that precedes a list
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
    std::uint64_t lines = 0;          ///< the number of lines of the header
};

/// Reads a header, up to the first byte of data. Lines end with LF, CR LF or CR, as the first line
/// does.
///
/// \throws ImportFailure if the header is invalid
PlyHeader readPlyHeader(ByteReader& bytes);

} // namespace Meshes
