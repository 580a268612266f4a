// SPDX-License-Identifier: BSL-1.0
/// Makes minimal libraries in ELF and PE format.
#pragma once

#include "components/componentManager/componentStamp.h"

#include <cstdint>
#include <optional>
#include <string>

namespace Mz::Test {

struct ImageTraits {
    const char* entryPoint = "QrGetComponentDescription";
    bool function = true;        ///< whether the entry point is a function
    bool otherProcessor = false; ///< 64-bit ARM; of an ELF file on ARM, x86-64
    bool program = false;
    std::optional<ComponentStamp> stamp = std::nullopt; ///< exported if set
    std::uint64_t stampAddress = 0;                     ///< another address than the stamp's if set
    unsigned char stampType = 0x11;                     ///< symbol type and binding (ELF)
    std::uint16_t stampSection = 1;                     ///< section of the symbol (ELF)
    const char* stampName = "MzComponentStamp";
};

/// Each returns a library that exports the entry point and needs "first.lib" and "second.lib".
std::string elfLibrary(const ImageTraits& traits);
std::string peLibrary(const ImageTraits& traits);

/// Addresses in these libraries. What is mapped from `fileEnd` to `memoryEnd` is not in the file.
struct ImagePlaces {
    std::uint64_t stamp, fileEnd, memoryEnd;
};
constexpr ImagePlaces elfPlaces{0x2A0, 0x300, 0x400}, pePlaces{0x2150, 0x2200, 0x2300};

} // namespace Mz::Test
