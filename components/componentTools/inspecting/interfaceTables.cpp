// SPDX-License-Identifier: BSL-1.0
/// Reads the tables in one pass over the content of their sections. Every size is checked before it
/// is used. After a table whose size makes no sense the rest cannot be found, and is ignored.
#include "components/componentTools/inspecting/interfaceTables.h"

#include "components/componentManager/interfaceTable.h"
#include "components/componentTools/images/libraryImage.h"

#include <algorithm>
#include <cstring>
#include <optional>

namespace Mz::Tools {

namespace {

constexpr std::size_t step = 8; // tables and entries begin at multiples of it

/// Returns the `T` at the begin of `bytes`, which are long enough.
template <class T>
T readHead(std::string_view bytes) {
    T value;
    std::memcpy(&value, bytes.data(), sizeof value);
    return value;
}

/// Returns the text up to its NUL. Characters that do not show are replaced.
std::string textOf(std::string_view bytes) {
    std::string text(bytes.substr(0, bytes.find('\0')));
    std::replace_if(
        text.begin(), text.end(),
        [](char character) {
            return static_cast<unsigned char>(character) < ' ' || character == '\177';
        },
        '?');
    return text;
}

/// Returns the slot that a pointer to a virtual function names. Accepts the layouts of all
/// processors: no entry is valid in both.
std::optional<std::int64_t> slotOf(const InterfaceEntry& entry) {
    constexpr std::int64_t slotSize = 8;
    const bool markedInFunction = entry.function % slotSize == 1 && entry.adjustment == 0;
    const bool markedInAdjustment = entry.function % slotSize == 0 && entry.adjustment == 1;
    if (entry.function < 0 || !(markedInFunction || markedInAdjustment))
        return std::nullopt;
    return entry.function / slotSize;
}

/// Adds an entry to the table. Returns false if it makes no sense.
bool addEntry(const InterfaceEntry& entry, const std::string& text, InterfaceTable& table) {
    const auto slot = slotOf(entry);
    switch (entry.kind) {
    case InterfaceEntryKind::name: table.name = text; return true;
    case InterfaceEntryKind::end: table.slotCount = slot.value_or(0); return slot.has_value();
    case InterfaceEntryKind::base:
        table.bases.push_back({text, slot.value_or(0), entry.valueSize,
                               (entry.flags & baseHasVirtualDestructor) != 0});
        return slot.has_value();
    case InterfaceEntryKind::operation:
        table.operations.push_back({slot.value_or(0), text});
        return slot.has_value();
    case InterfaceEntryKind::value:
        table.values.push_back({text, entry.valueSize, entry.alignment, entry.flags});
        return true;
    }
    return true; // An entry of a later version.
}

/// Returns the table whose bytes these are.
std::optional<InterfaceTable> parseTable(const InterfaceHead& head, std::string_view bytes) {
    InterfaceTable table;
    table.uid = head.uid;
    table.flags = head.flags;
    table.objectSize = head.objectSize;
    table.alignment = head.alignment;
    bytes.remove_prefix(sizeof head);
    for (std::uint32_t index = 0; index < head.entryCount; ++index) {
        if (bytes.size() < sizeof(InterfaceEntry))
            return std::nullopt;
        const auto entry = readHead<InterfaceEntry>(bytes);
        if (entry.size < sizeof entry || entry.size % step || entry.size > bytes.size() ||
            !addEntry(entry, textOf(bytes.substr(sizeof entry, entry.size - sizeof entry)), table))
            return std::nullopt;
        bytes.remove_prefix(entry.size);
    }
    return table;
}

} // namespace

std::vector<std::string_view> splitInterfaceTables(std::string_view content) {
    static constexpr char magic[8] = "MZiface";
    std::vector<std::string_view> tables;
    while (content.size() >= sizeof(InterfaceHead)) {
        if (readHead<std::uint64_t>(content) == 0) {
            content.remove_prefix(step); // Bytes that align the next table.
            continue;
        }
        const auto head = readHead<InterfaceHead>(content);
        if (std::memcmp(head.magic, magic, sizeof magic) != 0 || head.size < sizeof head ||
            head.size % step || head.size > content.size())
            break;
        tables.push_back(content.substr(0, head.size));
        content.remove_prefix(head.size);
    }
    return tables;
}

std::vector<InterfaceTable> parseInterfaceTables(std::string_view content) {
    constexpr std::uint16_t layout = 1;
    std::vector<InterfaceTable> tables;
    for (const std::string_view bytes : splitInterfaceTables(content)) {
        const auto head = readHead<InterfaceHead>(bytes);
        if (head.layout == layout)
            if (auto table = parseTable(head, bytes))
                tables.push_back(std::move(*table));
    }
    return tables;
}

std::vector<InterfaceTable> interfaceTablesOf(const std::filesystem::path& file) {
    return parseInterfaceTables(sectionsOf(file, interfaceSection));
}

} // namespace Mz::Tools
