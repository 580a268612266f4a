// SPDX-License-Identifier: BSL-1.0
/// Reads the values after the header of a PLY file, in any encoding.
#pragma once

#include "plyHeader.h"

#include <cstdint>
#include <memory>
#include <string>

namespace Meshes {

/// Reads values one after the other. The caller requests them in the order and with the types that
/// the header declares. Every operation throws `ImportFailure` if the data ends or is invalid.
class PlyValues {
  public:
    virtual ~PlyValues() = default;

    /// Starts the next item of an element. `index` is its number, from 0, for messages.
    virtual void beginItem(const PlyElement& element, std::uint32_t index) = 0;
    /// Ends the item: all its values were read.
    virtual void endItem() = 0;

    /// Reads a value as a `float`, which must be finite.
    virtual float number(PlyType type) = 0;
    /// Reads an index or the length of a list: an integer from 0 to 4294967294.
    virtual std::uint32_t index(PlyType type) = 0;
    /// Skips `count` values.
    virtual void skip(PlyType type, std::uint32_t count) = 0;

    /// Returns the position of the current item: "line" or "byte", and its number.
    virtual const char* unit() const = 0;
    virtual std::uint64_t place() const = 0;

    /// Throws `ImportFailure` with the position of the current item.
    [[noreturn]] void fail(const std::string& what) const;

    /// Throws `ImportFailure` unless only white space follows.
    virtual void expectEnd() = 0;
};

/// Returns a reader of the values after `header`. `bytes` must be positioned at their beginning,
/// and must outlive the result.
std::unique_ptr<PlyValues> makePlyValues(const PlyHeader& header, ByteReader& bytes);

} // namespace Meshes
