// SPDX-License-Identifier: BSL-1.0
/// Saves and loads one object, with all that it refers to, in one file.
#pragma once

#include "components/componentManager/cast.h"

#include <filesystem>

namespace Meshes {

/// The kind of stream in a file.
enum class Form { Binary, Text };

/// Replaces the content of `file` by `object` and all objects that it refers to. If it throws, the
/// old file is unchanged.
///
/// \throws QrStreamEx as `Mz::replaceFile` and the writing of objects do
void saveObject(const std::filesystem::path& file, Mz::QrCastable& object, Form form);

/// Returns the object in the file; null if null was saved. The caller owns the reference. The
/// post-load list has been notified.
///
/// \param wanted the uid of an interface that the object must have; may be null
/// \throws QrStreamEx::ExReadOpen if the file does not exist or cannot be opened
/// \throws QrStreamEx::ExReadObject with the position, if the file does not contain exactly one
/// such
///     object
Mz::QrRef<Mz::QrCastable> loadObject(const std::filesystem::path& file, const Mz::QrUid* wanted,
                                     Form form);

} // namespace Meshes
