// SPDX-License-Identifier: BSL-1.0
/// Which failures say nothing about a file.
#pragma once

#include <algorithm>
#include <cerrno>
#include <iterator>

namespace Mz::platform {

/// The errors of a system that lacks resources, or of a medium that cannot be read now. What failed
/// may succeed later, with the same file.
inline constexpr int temporaryErrors[] = {EMFILE, ENFILE, ENOMEM, EIO, EINTR, ESTALE};

/// Returns whether `error` is one of them.
inline bool isTemporary(int error) {
    return std::find(std::begin(temporaryErrors), std::end(temporaryErrors), error) !=
           std::end(temporaryErrors);
}

} // namespace Mz::platform
