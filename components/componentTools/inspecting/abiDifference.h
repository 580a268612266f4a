// SPDX-License-Identifier: BSL-1.0
/// Compares the stamp of a component library with the ABI of this program.
#pragma once

#include "components/componentManager/componentStamp.h"
#include "components/componentTools/images/libraryImage.h"
#include "components/componentTools/verdict.h"

#include <optional>

namespace Mz::Tools {

/// Returns the verdict `otherAbi`, with what the library has and what this program has, if an
/// object of the one cannot be used by the other; else `std::nullopt`.
std::optional<Finding> abiDifference(const ComponentStamp& stamp);

/// Returns the same for a file; `std::nullopt` if the file has no stamp.
std::optional<Finding> abiDifference(const LibraryImage& image);

/// Returns the properties that a stamp names, as text.
std::wstring textOf(const ComponentStamp& stamp);

/// Returns the same for the stamp that a component of this build has.
std::wstring ownStampText();

} // namespace Mz::Tools
