// SPDX-License-Identifier: BSL-1.0
/// Recognises image files by their first bytes.
///
/// The decoder could be asked too, but it tries all its formats on every file, and one of them has
/// no signature. Our own test reads a few bytes and never takes a file of another format.
#pragma once

#include "components/componentManager/bufferio.h"

/// Returns whether the data begins with the signature of a PNG file and its first chunk.
bool isPng(Mz::QrBufferedIO& io);

/// Returns whether the data begins with the first two markers of a JPEG file.
bool isJpeg(Mz::QrBufferedIO& io);

/// Returns whether the data begins with the header of a Windows bitmap whose offset of the pixels
/// and size of the information header are possible. "BM" alone also begins many a text.
bool isBmp(Mz::QrBufferedIO& io);
