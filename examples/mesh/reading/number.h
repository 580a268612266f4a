// SPDX-License-Identifier: BSL-1.0
/// Parsing of numbers, independent of the locale of the process.
#pragma once

#include <cstdint>
#include <optional>
#include <string_view>

namespace Meshes {

/// Returns `word`, which may begin with a sign, as the nearest finite `float`; 0 if it is too small
/// for a `float`. Nothing if it is too large or not a number.
std::optional<float> parseFloat(std::string_view word);

/// Returns `word` as an integer; nothing if it has a sign, is too large or is not an integer.
std::optional<std::uint32_t> parseUnsigned(std::string_view word);

/// Returns `word`, which may begin with a sign, as an integer; nothing if it is too large or not an
/// integer.
std::optional<std::int64_t> parseInteger(std::string_view word);

/// Returns whether `word` is a number of any size, or a spelling of infinity or not-a-number.
bool isNumber(std::string_view word);

} // namespace Meshes
