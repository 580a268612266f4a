// SPDX-License-Identifier: BSL-1.0
// Writes the headers and tables of minimal ELF and PE libraries field by field.
#include "tests/tools/images.h"

#include "components/platform/elfMachine.h"

#include <cstdint>
#include <cstring>
#include <initializer_list>

namespace Mz::Test {

namespace {

/// Bytes that can be written at any offset.
class Bytes {
  public:
    explicit Bytes(std::size_t size) : content(size, '\0') {}

    template <class T>
    void put(std::size_t offset, T value) {
        std::memcpy(content.data() + offset, &value, sizeof value);
    }
    void put(std::size_t offset, const std::string& text) {
        std::memcpy(content.data() + offset, text.data(), text.size());
    }
    template <class T>
    void row(std::size_t offset, std::initializer_list<T> values) {
        for (const T value : values) {
            put(offset, value);
            offset += sizeof value;
        }
    }

    std::string content;
};

using Half = std::uint16_t;
using Word = std::uint32_t;
using Long = std::uint64_t;

Word gnuHash(const std::string& name) {
    Word hash = 5381;
    for (const char c : name)
        hash = hash * 33 + static_cast<unsigned char>(c);
    return hash;
}

} // namespace

std::string elfLibrary(const ImageTraits& traits) {
    constexpr std::size_t segments = 0x40, strings = 0x100, symbols = 0x150, hash = 0x1C0,
                          dynamic = 0x200, sections = 0x2C0, size = elfPlaces.fileEnd;
    Bytes bytes(size);
    bytes.put(0, std::string("\177ELF\2\1\1", 7));
    const Half other = platform::nativeElfMachine == platform::elfX86_64 ? platform::elfAArch64
                                                                         : platform::elfX86_64;
    bytes.row<Half>(16, {3, traits.otherProcessor ? other : platform::nativeElfMachine});
    bytes.row<Long>(32, {segments, sections});
    bytes.row<Half>(52, {64, 56, 2, 64, 1, 0});
    // The first segment maps the whole file at its own offsets. The second one is the dynamic
    // section.
    bytes.row<Word>(segments, {1, 5});
    bytes.row<Long>(segments + 8, {0, 0, 0, size, elfPlaces.memoryEnd, 4096});
    bytes.row<Word>(segments + 56, {2, 4});
    bytes.row<Long>(segments + 56 + 8, {dynamic, dynamic, dynamic, 0xA0, 0xA0, 8});
    std::string text("\0first.lib\0second.lib\0", 22);
    if (traits.stamp)
        text += traits.stampName + std::string(1, '\0');
    const auto entryPointPlace = static_cast<Word>(text.size());
    text += traits.entryPoint;
    bytes.put(strings, text);
    // Symbol 1 is the entry point: a global function or a global object, in section 1.
    bytes.put<Word>(symbols + 24, entryPointPlace);
    bytes.put<unsigned char>(symbols + 28,
                             static_cast<unsigned char>(traits.function ? 0x12 : 0x11));
    bytes.put<Half>(symbols + 30, 1);
    bytes.put<Long>(symbols + 32, 0x100);
    // One bucket, which begins with symbol 1, and a filter that passes every name.
    bytes.row<Word>(hash, {1, 1, 1, 0});
    bytes.put<Long>(hash + 16, ~Long{0});
    bytes.row<Word>(hash + 24, {1, gnuHash(traits.entryPoint) | 1});
    if (traits.stamp) {
        // Symbol 2, at the end of the bucket.
        bytes.put<Word>(symbols + 48, 22);
        bytes.put(symbols + 52, traits.stampType);
        bytes.put<Half>(symbols + 54, traits.stampSection);
        bytes.put<Long>(symbols + 56, traits.stampAddress ? traits.stampAddress : elfPlaces.stamp);
        bytes.row<Word>(hash + 28,
                        {gnuHash(traits.entryPoint) & ~Word{1}, gnuHash(traits.stampName) | 1});
        bytes.put(elfPlaces.stamp, *traits.stamp);
    }
    bytes.row<Long>(dynamic, {1, 1, 1, 11, 5, strings, 10, text.size() + 1, 6, symbols, 0x6FFFFEF5,
                              hash, 0x6FFFFFFB, traits.program ? Long{0x08000000} : 0, 0, 0});
    return bytes.content;
}

std::string peLibrary(const ImageTraits& traits) {
    constexpr std::size_t header = 0x40, optional = header + 24, optionalSize = 112 + 16 * 8,
                          table = optional + optionalSize, code = 0x200, data = 0x400, size = 0x600;
    constexpr Word codeAddress = 0x1000, dataAddress = 0x2000;
    Bytes bytes(size);
    bytes.put(0, std::string("MZ"));
    bytes.put<Word>(0x3C, header);
    bytes.put(header, std::string("PE\0\0", 4));
    bytes.row<Half>(header + 4, {static_cast<Half>(traits.otherProcessor ? 0xAA64 : 0x8664), 2});
    bytes.row<Half>(header + 20, {optionalSize, static_cast<Half>(traits.program ? 0x22 : 0x2022)});
    bytes.put<Half>(optional, 0x20B);
    bytes.row<Word>(optional + 32, {0x1000, 0x200});
    bytes.put<Word>(optional + 56, 0x3000);
    bytes.put<Word>(optional + 108, 16);
    bytes.row<Word>(optional + 112, {dataAddress, 0x80, dataAddress + 0x80, 60});
    bytes.put(table, std::string(".text"));
    bytes.row<Word>(table + 8, {0x200, codeAddress, 0x200, code});
    bytes.put<Word>(table + 36, 0x60000020);
    bytes.put(table + 40, std::string(".data"));
    bytes.row<Word>(table + 48, {static_cast<Word>(pePlaces.memoryEnd) - dataAddress, dataAddress,
                                 0x200, data});
    bytes.put<Word>(table + 76, 0xC0000040);
    // One export: its address, its name and its ordinal.
    bytes.row<Word>(data, {0, 0, 0, dataAddress + 0x60, 1, 1, 1, dataAddress + 0x28,
                           dataAddress + 0x2C, dataAddress + 0x30});
    bytes.row<Word>(data + 0x28,
                    {traits.function ? codeAddress : dataAddress + 0x1F0, dataAddress + 0x38});
    if (traits.stamp) {
        // Two exports, whose tables are behind the library's name. The names are sorted.
        bytes.row<Word>(data + 20,
                        {2, 2, dataAddress + 0x6C, dataAddress + 0x74, dataAddress + 0x7C});
        bytes.row<Word>(data + 0x6C, {static_cast<Word>(traits.stampAddress ? traits.stampAddress
                                                                            : pePlaces.stamp),
                                      traits.function ? codeAddress : dataAddress + 0x1F0,
                                      dataAddress + 0x130, dataAddress + 0x38});
        bytes.row<Half>(data + 0x7C, {0, 1});
        bytes.put(data + 0x130, std::string(traits.stampName));
        bytes.put(data + pePlaces.stamp - dataAddress, *traits.stamp);
    }
    bytes.put(data + 0x38, std::string(traits.entryPoint));
    bytes.put(data + 0x60, std::string("image.dll"));
    bytes.row<Word>(data + 0x80, {0, 0, 0, dataAddress + 0x100, 0});
    bytes.row<Word>(data + 0x94, {0, 0, 0, dataAddress + 0x110, 0});
    bytes.put(data + 0x100, std::string("first.lib"));
    bytes.put(data + 0x110, std::string("second.lib"));
    return bytes.content;
}

} // namespace Mz::Test
