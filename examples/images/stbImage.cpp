// SPDX-License-Identifier: BSL-1.0
/// The implementation of stb_image, compiled once and with internal names: the component exports
/// nothing of it, so another plug-in may have another version.
#define STB_IMAGE_IMPLEMENTATION
#include "stbImage.h"
