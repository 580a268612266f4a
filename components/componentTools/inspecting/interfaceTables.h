// SPDX-License-Identifier: BSL-1.0
/// Reads the fingerprints of interfaces (`fingerprint.h`) from the file of a library or program.
#pragma once

#include "components/componentManager/uid.h"

#include <cstdint>
#include <filesystem>
#include <string>
#include <string_view>
#include <vector>

namespace Mz::Tools {

/// An operation with its declaration, such as "const char* greeting() const".
struct InterfaceOperation {
    std::int64_t slot = 0; ///< in the vtable, counted from 0
    std::string text;
};

/// A class or enumeration that an operation takes or returns by value.
struct InterfaceValue {
    std::string name;
    std::uint32_t size = 0;      ///< 0 if the type was incomplete
    std::uint32_t alignment = 0; ///< 0 if the type was incomplete
    std::uint16_t flags = 0;     ///< see `valueIsTrivial`
};

/// A base that has no fingerprint.
struct InterfaceBase {
    std::string name;
    std::int64_t slotCount = 0;
    std::uint32_t size = 0;
    bool virtualDestructor = false;
};

/// The fingerprint of one interface.
struct InterfaceTable {
    QrUid uid{};
    std::uint16_t flags = 0; ///< see `interfaceGrows`
    std::uint32_t objectSize = 0;
    std::uint32_t alignment = 0;
    std::string name;
    std::int64_t slotCount = 0; ///< of its first vtable
    std::vector<InterfaceOperation> operations;
    std::vector<InterfaceBase> bases;
    std::vector<InterfaceValue> values;
};

/// Returns the fingerprints in the file; empty if there are none, or if it cannot be read. Nothing
/// in the file is trusted: a table that makes no sense is skipped.
std::vector<InterfaceTable> interfaceTablesOf(const std::filesystem::path& file);

/// Returns the fingerprints in the content of a file's sections.
std::vector<InterfaceTable> parseInterfaceTables(std::string_view content);

/// Returns the bytes of each fingerprint in the content, without reading them further.
std::vector<std::string_view> splitInterfaceTables(std::string_view content);

} // namespace Mz::Tools
