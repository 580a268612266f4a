// SPDX-License-Identifier: BSL-1.0
/// Makes and changes Windows libraries byte by byte, on any system.
#pragma once

#include <cstddef>
#include <cstdint>
#include <cstring>
#include <string>
#include <tuple>
#include <vector>

namespace Mz::Test {

template <class T>
T getAt(const std::string& content, std::size_t offset) {
    T value{};
    std::memcpy(&value, content.data() + offset, sizeof value);
    return value;
}

template <class T>
void putAt(std::string& content, std::size_t offset, const T& value) {
    std::memcpy(content.data() + offset, &value, sizeof value);
}

/// The offsets of the fields that the tests change.
namespace PeField {

// In the headers, from the signature on.
constexpr std::size_t machine = 4, sectionCount = 6, symbolTable = 12, symbolCount = 16,
                      optionalSize = 20, characteristics = 22;
// In the optional header.
constexpr std::size_t magic = 24, sectionAlignment = 24 + 32, imageSize = 24 + 56,
                      directoryCount = 24 + 108, exportAddress = 24 + 112, exportSize = 24 + 116,
                      importAddress = 24 + 120, certificateOffset = 24 + 144,
                      certificateSize = 24 + 148;
// In a section's entry.
constexpr std::size_t memorySize = 8, address = 12, fileSize = 16, offset = 20, flags = 36;
constexpr std::size_t sectionEntry = 40;
// In the export directory.
constexpr std::size_t functionCount = 20, nameCount = 24, functions = 28, names = 32, ordinals = 36;

} // namespace PeField

/// Returns the offset of the headers.
inline std::size_t headerOf(const std::string& content) {
    return getAt<std::uint32_t>(content, 0x3C);
}

inline std::size_t sectionsOf(const std::string& content) {
    const std::size_t header = headerOf(content);
    return header + 24 + getAt<std::uint16_t>(content, header + PeField::optionalSize);
}

/// Returns the file offset of `address` in the mapped image, or 0.
inline std::size_t placeOf(const std::string& content, std::uint32_t address) {
    const std::size_t count =
        getAt<std::uint16_t>(content, headerOf(content) + PeField::sectionCount);
    for (std::size_t index = 0; index < count; ++index) {
        const std::size_t section = sectionsOf(content) + index * PeField::sectionEntry;
        const auto start = getAt<std::uint32_t>(content, section + PeField::address);
        const auto size = getAt<std::uint32_t>(content, section + PeField::fileSize);
        if (address >= start && address - start < size)
            return getAt<std::uint32_t>(content, section + PeField::offset) + address - start;
    }
    return 0;
}

/// Returns the file offset of the export directory.
inline std::size_t exportsOf(const std::string& content) {
    return placeOf(content,
                   getAt<std::uint32_t>(content, headerOf(content) + PeField::exportAddress));
}

/// Returns the content with one field changed.
template <class T>
std::string changedAt(std::string content, std::size_t offset, T value) {
    putAt(content, offset, value);
    return content;
}

/// A name of an export table and its address.
struct PeExport {
    std::string name;
    std::uint32_t address;
};

/// The addresses of the code, the data and the export table of `madeLibrary`.
constexpr std::uint32_t peCode = 0x1000, peData = 0x2000, peExports = 0x3000;

/// Returns a library that the system can load: a function that returns 0, a few bytes of data, and
/// the exports in the given order.
inline std::string madeLibrary(const std::vector<PeExport>& exports) {
    std::string table(40 + exports.size() * 10, '\0');
    const auto count = static_cast<std::uint32_t>(exports.size());
    const std::uint32_t functions = 40, names = functions + count * 4, ordinals = names + count * 4;
    for (std::uint32_t index = 0; index < count; ++index) {
        putAt(table, functions + index * 4, exports[index].address);
        putAt(table, names + index * 4, peExports + static_cast<std::uint32_t>(table.size()));
        putAt(table, ordinals + index * 2, static_cast<std::uint16_t>(index));
        table += exports[index].name + '\0';
    }
    const auto tableSize = static_cast<std::uint32_t>(table.size());
    putAt(table, 12, peExports + tableSize); // the library's name
    table += std::string("made.dll") + '\0';
    putAt(table, 16, std::uint32_t{1});
    putAt(table, PeField::functionCount, count);
    putAt(table, PeField::nameCount, count);
    putAt(table, PeField::functions, peExports + functions);
    putAt(table, PeField::names, peExports + names);
    putAt(table, PeField::ordinals, peExports + ordinals);
    const auto exportSize = static_cast<std::uint32_t>(table.size());

    constexpr std::size_t header = 0x80;
    std::string content(0x400, '\0');
    content.replace(0, 2, "MZ");
    putAt(content, 0x3C, std::uint32_t{header});
    content.replace(header, 2, "PE");
    putAt(content, header + PeField::machine, std::uint16_t{0x8664});
    putAt(content, header + PeField::sectionCount, std::uint16_t{3});
    putAt(content, header + PeField::optionalSize, std::uint16_t{240});
    putAt(content, header + PeField::characteristics, std::uint16_t{0x2022});
    const std::size_t optional = header + 24;
    putAt(content, optional, std::uint16_t{0x20B});
    putAt(content, optional + 20, peCode);
    putAt(content, optional + 24, std::uint64_t{0x180000000});
    putAt(content, optional + 32, std::uint32_t{0x1000}); // alignment of sections
    putAt(content, optional + 36, std::uint32_t{0x200});  // alignment in the file
    putAt(content, optional + 40, std::uint16_t{6});      // the system's version
    putAt(content, optional + 48, std::uint16_t{6});      // the subsystem's
    putAt(content, optional + 60, std::uint32_t{0x400});  // size of the headers
    putAt(content, optional + 68, std::uint16_t{3});      // subsystem: console
    for (const std::size_t offset : {72U, 80U, 88U, 96U}) // stack and heap
        putAt(content, optional + offset, std::uint64_t{0x1000});
    putAt(content, header + PeField::directoryCount, std::uint32_t{16});
    putAt(content, header + PeField::exportAddress, peExports);
    putAt(content, header + PeField::exportSize, exportSize);

    const std::string code("\x31\xC0\xC3", 3); // xor eax, eax; ret
    const std::string data(16, 'd');
    std::size_t entry = optional + 240;
    std::uint32_t imageEnd = 0;
    for (const auto& [bytes, address, flags] :
         {std::tuple(code, peCode, 0x60000020u), std::tuple(data, peData, 0xC0000040u),
          std::tuple(table, peExports, 0x40000040u)}) {
        const auto used = static_cast<std::uint32_t>(bytes.size());
        const std::uint32_t stored = (used + 0x1FF) / 0x200 * 0x200;
        putAt(content, entry + PeField::memorySize, used);
        putAt(content, entry + PeField::address, address);
        putAt(content, entry + PeField::fileSize, stored);
        putAt(content, entry + PeField::offset, static_cast<std::uint32_t>(content.size()));
        putAt(content, entry + PeField::flags, flags);
        entry += PeField::sectionEntry;
        content += bytes + std::string(stored - used, '\0');
        imageEnd = (address + used + 0xFFF) / 0x1000 * 0x1000;
    }
    putAt(content, header + PeField::imageSize, imageEnd);
    return content;
}

} // namespace Mz::Test
