// SPDX-License-Identifier: BSL-1.0
/// What the import builders of images and their hosts agree on.
#pragma once

#include "components/componentKit/uidLiteral.h"
#include "components/componentManager/cast.h"

#include <cstddef>
#include <cstdint>
#include <span>

using namespace Mz::literals; // "..."_uid

/// A picture. It does not change, so any thread may use it.
class Image : public Mz::QrCastable {
  public:
    using Self = Image;
    static constexpr Mz::QrUid uid = "B3970E01-7A6C-11EF-97D8-5A1C40E2F68B"_uid;

    struct Pixel {
        std::uint8_t red, green, blue, alpha;
    };

    virtual std::size_t width() const = 0;
    virtual std::size_t height() const = 0;

    /// Returns the `width() * height()` pixels, row by row, the top row first. Valid as long as the
    /// image.
    virtual std::span<const Pixel> pixels() const = 0;
};

/// The builder name of all import builders whose objects are `Image`s.
#define IMAGE_BUILDERS L"image"
