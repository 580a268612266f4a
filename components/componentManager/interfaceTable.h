// SPDX-License-Identifier: BSL-1.0
/// The layout of the table that `MZ_INTERFACE` of `fingerprint.h` puts into a library or program.
///
/// The tables of a file are in its sections whose names begin with "mziface", one after the other.
/// Bytes of 0 may separate them. A table is one `InterfaceHead`, followed by
/// `InterfaceHead::entryCount` entries; each entry is one `InterfaceEntry`, followed by its text.
/// Numbers are little-endian, as on all supported processors. There are no addresses in a table, so
/// that the bytes in the file are valid as they are.
///
/// \since 0.2
#pragma once

#include "components/componentManager/uid.h"

#include <cstddef>
#include <cstdint>
#include <type_traits>

namespace Mz {

/// The begin of the names of the sections, in ELF and PE files.
inline constexpr const char* interfaceSection = "mziface";

/// The properties in `InterfaceHead::flags`.
/// Later versions may add operations at its end: see `MZ_GROWING_INTERFACE`.
inline constexpr std::uint16_t interfaceGrows = 1;
/// Compiled by Clang, which leaves inline namespaces out of names.
inline constexpr std::uint16_t interfaceFromClang = 2;

/// The begin of a table. A table with another `layout` is skipped by its `size`.
struct InterfaceHead {
    char magic[8];            ///< "MZiface" and NUL
    std::uint16_t layout;     ///< 1
    std::uint16_t flags;      ///< see `interfaceGrows`
    std::uint32_t size;       ///< of the whole table, in bytes: a multiple of 8
    QrUid uid;                ///< of the interface
    std::uint32_t objectSize; ///< `sizeof` of the interface
    std::uint32_t alignment;  ///< `alignof` of the interface
    std::uint32_t entryCount; ///< the number of entries
    std::uint32_t reserved;   ///< 0
};
static_assert(sizeof(InterfaceHead) == 48 && std::is_trivially_copyable_v<InterfaceHead>);

/// What an entry describes.
enum class InterfaceEntryKind : std::uint16_t {
    name = 1,      ///< the interface; text: its name
    end = 2,       ///< `function`: the first slot behind those of the interface
    base = 3,      ///< a base; text: its name; `function`: the first slot behind its own
    operation = 4, ///< text: its declaration, such as "const char* greeting() const"
    value = 5,     ///< a class or enumeration that an operation takes or returns by value; text:
                   ///< its name
};

/// The properties in `InterfaceEntry::flags` of a class that is passed by value, and of a base.
inline constexpr std::uint16_t valueIsTrivial = 1;           ///< it may be passed in registers
inline constexpr std::uint16_t valueIsPolymorphic = 2;       ///< it has virtual functions
inline constexpr std::uint16_t baseHasVirtualDestructor = 1; ///< of a base

/// The begin of an entry. The pointer to a virtual function of the Itanium C++ ABI is the offset of
/// its slot in bytes, plus 1, followed by 0; on ARM processors the offset, followed by 1.
struct InterfaceEntry {
    InterfaceEntryKind kind; ///< what it describes
    std::uint16_t flags;     ///< of a value or base: see `valueIsTrivial`; else 0
    std::uint32_t size;      ///< of the entry and its text, in bytes: a multiple of 8
    std::uint32_t valueSize; ///< `sizeof` of a value or base; 0 if the type is incomplete
    std::uint32_t alignment; ///< `alignof` of a value or base; 0 if the type is incomplete
    std::int64_t function;   ///< of `end`, `base` and `operation`
    std::int64_t adjustment; ///< 0; on ARM processors 1, of those three
};
static_assert(sizeof(InterfaceEntry) == 32 && std::is_trivially_copyable_v<InterfaceEntry>);

} // namespace Mz
