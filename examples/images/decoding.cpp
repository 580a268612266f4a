// SPDX-License-Identifier: BSL-1.0
/// Reads the whole file into memory, up to its limit, and gives it to the decoder from there. The
/// decoder could read through callbacks, but it cannot be stopped in the middle by an exception: it
/// is C code, which would lose what it has allocated. While the file is read, it can.
#include "decoding.h"

#include "stbImage.h"

#include <algorithm>
#include <memory>
#include <string>

namespace {

std::vector<unsigned char> readAll(Mz::QrBufferedIO& io, Mz::QrProcessControl* controller,
                                   std::size_t most) {
    constexpr int portion = 64 * 1024;
    std::vector<unsigned char> bytes;
    for (int count = portion; count == portion;) {
        if (controller && controller->isInterrupted())
            throw ImageInterrupted();
        const std::size_t before = bytes.size();
        bytes.resize(before + portion);
        count = io.read(bytes.data() + before, portion);
        bytes.resize(before + static_cast<std::size_t>(std::max(count, 0)));
        if (bytes.size() > most)
            throw ImageError("the file is larger than " + std::to_string(most) + " bytes");
    }
    return bytes;
}

void checkSize(int width, int height, const ImageLimits& limits) {
    const auto w = static_cast<std::size_t>(width);
    const auto h = static_cast<std::size_t>(height);
    if (width <= 0 || height <= 0)
        throw ImageError("the image has no pixels");
    if (w > limits.side || h > limits.side || w > limits.pixelCount / h)
        throw ImageError("the image is too large: " + std::to_string(w) + " x " +
                         std::to_string(h) + " pixels");
}

/// Returns the decoder's reason for its last failure in this thread.
std::string reason() {
    const char* const text = stbi_failure_reason();
    return text ? text : "unknown";
}

} // namespace

DecodedImage decodeImage(Mz::QrBufferedIO& io, Mz::QrProcessControl* controller,
                         const ImageLimits& limits) {
    const std::vector<unsigned char> bytes = readAll(io, controller, limits.fileSize);
    const int size = static_cast<int>(bytes.size());

    int width = 0;
    int height = 0;
    int channels = 0;
    if (!stbi_info_from_memory(bytes.data(), size, &width, &height, &channels))
        throw ImageError("the decoder rejects the header: " + reason());
    checkSize(width, height, limits);

    constexpr int wantedChannels = 4; // red, green, blue, alpha
    const std::unique_ptr<stbi_uc, void (*)(void*)> decoded(
        stbi_load_from_memory(bytes.data(), size, &width, &height, &channels, wantedChannels),
        stbi_image_free);
    if (!decoded)
        throw ImageError("the decoder rejects the image: " + reason());
    checkSize(width, height, limits); // The decoder reads the header again.

    DecodedImage image;
    image.width = static_cast<std::size_t>(width);
    image.height = static_cast<std::size_t>(height);
    image.pixels.reserve(image.width * image.height);
    const stbi_uc* from = decoded.get();
    for (std::size_t left = image.width * image.height; left > 0; --left, from += wantedChannels)
        image.pixels.push_back({from[0], from[1], from[2], from[3]});
    return image;
}
