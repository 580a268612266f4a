// SPDX-License-Identifier: BSL-1.0
/// Decodes an image through stb_image, within limits.
#pragma once

#include "image.h"

#include "components/componentManager/bufferio.h"
#include "components/componentManager/processControl.h"

#include <cstddef>
#include <stdexcept>
#include <vector>

/// What an image may be at most. A file of a few bytes can claim any size.
struct ImageLimits {
    std::size_t fileSize = 64u << 20;   ///< in bytes, of the encoded file; at most the largest int
    std::size_t side = 16'384;          ///< in pixels, of width and height
    std::size_t pixelCount = 64u << 20; ///< 256 MB when it is decoded
};

/// Why an image could not be decoded, in a sentence without a full stop.
class ImageError : public std::runtime_error {
  public:
    using std::runtime_error::runtime_error;
};

/// The user interrupted the work. There is nothing to report.
struct ImageInterrupted {};

/// A decoded image.
struct DecodedImage {
    std::size_t width = 0;
    std::size_t height = 0;
    std::vector<Image::Pixel> pixels;
};

/// Returns the image in `io`. The size that its header claims is checked before any pixel is
/// decoded.
///
/// \param controller  asked for interruptions while the file is read; may be null
/// \throws ImageError  if the data is invalid or exceeds a limit
/// \throws ImageInterrupted  if the controller says so
/// \throws std::bad_alloc  if memory runs out
DecodedImage decodeImage(Mz::QrBufferedIO& io, Mz::QrProcessControl* controller,
                         const ImageLimits& limits = {});
