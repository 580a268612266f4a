// SPDX-License-Identifier: BSL-1.0
/// The exceptions of reading code, which never leave the builder.
#pragma once

#include <string>
#include <string_view>

namespace Meshes {

/// Thrown when the data is invalid. The builder reports the reason and returns null.
struct ImportFailure {
    std::string reason; ///< position and fault, in ASCII
};

/// Thrown when the user stops the import. The builder returns null and reports nothing.
struct ImportInterrupted {};

/// Returns `word` for a message: in quotes, truncated to 40 characters, with a question mark in
/// place of every byte that is not printable ASCII.
std::string quoted(std::string_view word);

} // namespace Meshes
