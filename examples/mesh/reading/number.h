/// Numbers in text, read alike whatever the process's locale is.
#pragma once

#include <cstdint>
#include <optional>
#include <string_view>

namespace Meshes {

/// `word` as a finite `float`, rounded to the nearest one, with an optional sign in front. Nothing
/// when it is anything else, or too large; what is too small to be a `float` is 0.
std::optional<float> parseFloat(std::string_view word);

/// `word` as an integer without a sign.
std::optional<std::uint32_t> parseUnsigned(std::string_view word);

/// `word` as an integer with an optional sign.
std::optional<std::int64_t> parseInteger(std::string_view word);

/// Whether `word` is a number of any size, or one of the spellings of infinity and "not a number".
bool isNumber(std::string_view word);

} // namespace Meshes
