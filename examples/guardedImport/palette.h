// SPDX-License-Identifier: BSL-1.0
/// What host and component share: the interface of palettes, and the identity of their class.
#pragma once

#include "components/componentManager/cast.h"

#include <cstdint>
#include <vector>

/// A list of colours.
class Palette : public Mz::QrCastable {
  public:
    using Self = Palette;
    static constexpr Mz::QrUid uid{0x8E52C210, 0x6A1F11EF, 0x9D3C7B10, 0x5D3E8F41};

    /// The colours, each 0xRRGGBB.
    std::vector<std::uint32_t> colours;
};

/// The class of the palettes that the importer makes. The host accepts no other.
inline constexpr Mz::QrUid storedPaletteUid{0x8E52C211, 0x6A1F11EF, 0x9D3C7B10, 0x5D3E8F41};
