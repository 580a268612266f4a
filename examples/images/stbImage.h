// SPDX-License-Identifier: BSL-1.0
/// stb_image with the formats that this component registers, and no others: what is left out cannot
/// be attacked.
#pragma once

#define STBI_ONLY_PNG
#define STBI_ONLY_JPEG
#define STBI_ONLY_BMP
#define STBI_NO_STDIO        // It reads from memory only.
#define STBI_FAILURE_USERMSG // Its reasons are for people.
#include <stb_image.h>
