/// Objects in files of their own.
#pragma once

#include "components/componentManager/cast.h"

#include <filesystem>

namespace Meshes {

enum class Form { Binary, Text };

/// Saves the object, and all that it refers to, in place of whatever the file held. Throws what
/// `Mz::replaceFile` and the writing of objects throw; then the old file is as it was.
void saveObject(const std::filesystem::path& file, Mz::QrCastable& object, Form form);

/// The object in the file, which answers for the interface `wanted`, or for any one when that is
/// null. All that is read has been told of the end of the load.
///
/// Raises `QrStreamEx::ExReadOpen` when there is no such file, and `ExReadObject`, with the place
/// in the file, when it holds anything but one such object.
Mz::QrRef<Mz::QrCastable> loadObject(const std::filesystem::path& file, const Mz::QrUid* wanted,
                                     Form form);

} // namespace Meshes
