/// How reading code gives up: by an exception that never leaves the builder.
#pragma once

#include <string>
#include <string_view>

namespace Meshes {

/// The data is not what it should be. The builder tells the user and gives no object.
struct ImportFailure {
    std::string reason; ///< where and what, in plain ASCII
};

/// The user wants the work to stop. There is nothing to tell.
struct ImportInterrupted {};

/// `word` as it may be shown: in quotes, cut to a length that fits a line, with everything that is
/// not printable ASCII replaced.
std::string quoted(std::string_view word);

} // namespace Meshes
