// SPDX-License-Identifier: BSL-1.0
/// One implementation reads text, the other binary data, so that the code for vertices and faces is
/// the same for both. Text goes through `TextReader`, one item per line; binary values are
/// assembled byte by byte, which works for both byte orders on any machine.
#include "plyValues.h"

#include "examples/mesh/mesh.h"
#include "examples/mesh/reading/binaryValue.h"
#include "examples/mesh/reading/failure.h"
#include "examples/mesh/reading/number.h"
#include "examples/mesh/reading/textReader.h"

#include <array>
#include <bit>
#include <cmath>
#include <limits>
#include <optional>
#include <span>

namespace Meshes {

namespace {

std::string inItem(const PlyElement& element, std::uint32_t index) {
    return "the file ends at " + quoted(element.name) + " " + std::to_string(index) + " of " +
           std::to_string(element.count);
}

class TextValues final : public PlyValues {
  public:
    TextValues(ByteReader& bytes, std::uint64_t firstLine)
        : text(bytes, {.comments = false, .continuations = false}, firstLine) {}

    void beginItem(const PlyElement& element, std::uint32_t index) override {
        if (!text.nextLine())
            text.fail(inItem(element, index));
        atFirstWord = true;
    }

    void endItem() override { text.expectEndOfLine(); }

    float number(PlyType) override {
        takeWord();
        const std::optional<float> value = parseFloat(text.word());
        if (!value)
            text.fail(quoted(text.word()) + " is no number");
        return *value;
    }

    std::uint32_t index(PlyType) override {
        takeWord();
        const std::optional<std::uint32_t> value = parseUnsigned(text.word());
        if (!value || *value == Mesh::absent)
            text.fail(quoted(text.word()) + " is no index and no length");
        return *value;
    }

    void skip(PlyType, std::uint32_t count) override {
        for (; count > 0; --count) {
            takeWord();
            if (!isNumber(text.word()))
                text.fail(quoted(text.word()) + " is no number");
        }
    }

    const char* unit() const override { return "line"; }
    std::uint64_t place() const override { return text.line(); }

    void expectEnd() override {
        if (text.nextLine())
            text.fail(quoted(text.word()) + " stands behind the last element");
    }

  private:
    void takeWord() {
        if (!atFirstWord && !text.nextWord())
            text.fail("the line has too few values");
        atFirstWord = false;
    }

    TextReader text;
    bool atFirstWord = false; ///< `nextLine` has read the first word of the item
};

class BinaryValues final : public PlyValues {
  public:
    BinaryValues(ByteReader& bytes, bool bigEndian) : bytes(bytes), bigEndian(bigEndian) {}

    void beginItem(const PlyElement& newElement, std::uint32_t newIndex) override {
        element = &newElement;
        itemIndex = newIndex;
        itemOffset = bytes.offset();
    }

    void endItem() override {}

    float number(PlyType type) override {
        const auto value = static_cast<float>(take(type));
        if (!std::isfinite(value))
            fail("a value is not finite");
        return value;
    }

    std::uint32_t index(PlyType type) override {
        const double value = take(type);
        if (!(value >= 0 && value < Mesh::absent))
            fail("a negative or too large index or length");
        return static_cast<std::uint32_t>(value);
    }

    void skip(PlyType type, std::uint32_t count) override {
        const std::uint64_t size = std::uint64_t{sizeOf(type)} * count;
        if (bytes.skip(size) < size)
            fail(inItem(*element, itemIndex));
    }

    const char* unit() const override { return "byte"; }
    std::uint64_t place() const override { return itemOffset; }

    void expectEnd() override {
        const std::uint64_t offset = bytes.offset();
        for (int byte = bytes.get(); byte != ByteReader::end; byte = bytes.get())
            if (byte != ' ' && (byte < '\t' || byte > '\r'))
                ByteReader::fail(offset, "there is more data than elements");
    }

  private:
    /// Reads a value of any type: a `double` represents all of them exactly. A `double` beyond the
    /// range of `float` becomes infinite, because its conversion to `float` would be undefined.
    double take(PlyType type) {
        std::array<unsigned char, 8> buffer;
        const std::span<unsigned char> data(buffer.data(), sizeOf(type));
        if (bytes.read(data) < data.size())
            fail(inItem(*element, itemIndex));
        if (type == PlyType::float32)
            return floatValue(data, bigEndian);
        const std::uint64_t bits = unsignedValue(data, bigEndian);
        if (type == PlyType::float64)
            return withinFloat(std::bit_cast<double>(bits));
        if (!isSigned(type))
            return static_cast<double>(bits);
        const std::uint64_t range = std::uint64_t{1} << (8 * data.size());
        return static_cast<double>(bits) - (bits >= range / 2 ? static_cast<double>(range) : 0.0);
    }

    static double withinFloat(double value) {
        constexpr double largest = std::numeric_limits<float>::max();
        return std::abs(value) <= largest ? value : std::numeric_limits<double>::infinity();
    }

    ByteReader& bytes;
    bool bigEndian;
    const PlyElement* element = nullptr;
    std::uint32_t itemIndex = 0;
    std::uint64_t itemOffset = 0;
};

} // namespace

void PlyValues::fail(const std::string& what) const {
    throw ImportFailure{std::string(unit()) + " " + std::to_string(place()) + ": " + what};
}

std::unique_ptr<PlyValues> makePlyValues(const PlyHeader& header, ByteReader& bytes) {
    if (header.encoding == PlyEncoding::ascii)
        return std::make_unique<TextValues>(bytes, header.lines + 1);
    return std::make_unique<BinaryValues>(bytes, header.encoding == PlyEncoding::bigEndian);
}

} // namespace Meshes
