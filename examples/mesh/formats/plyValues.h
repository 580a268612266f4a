/// The values behind the header of a PLY file, in whichever encoding.
#pragma once

#include "plyHeader.h"

#include <memory>

namespace Meshes {

/// Gives out the values one after the other, in the order and with the types that the header
/// declares. Every operation gives up where the data ends or makes no sense.
class PlyValues {
  public:
    virtual ~PlyValues() = default;

    /// Goes to the next item of an element; `index` says which, counted from 0.
    virtual void beginItem(const PlyElement& element, std::uint32_t index) = 0;
    /// Says that all values of the item were taken.
    virtual void endItem() = 0;

    /// A value that has to be finite, as a `float`.
    virtual float number(PlyType type) = 0;
    /// A value that has to be an integer from 0 to 4294967294: an index, or the length of a list.
    virtual std::uint32_t index(PlyType type) = 0;
    /// Passes over `count` values.
    virtual void skip(PlyType type, std::uint32_t count) = 0;

    /// Where the item begins, as "line" or "byte" and its number.
    virtual const char* unit() const = 0;
    virtual std::uint64_t place() const = 0;

    /// Gives up, saying that place.
    [[noreturn]] void fail(const std::string& what) const;

    /// Gives up unless the data ends here, but for white space.
    virtual void expectEnd() = 0;
};

/// The values behind `header`, of which `bytes` has just been read.
std::unique_ptr<PlyValues> makePlyValues(const PlyHeader& header, ByteReader& bytes);

} // namespace Meshes
