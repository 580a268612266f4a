// SPDX-License-Identifier: BSL-1.0
/// Parses with `std::from_chars`, which knows no locale and rounds correctly. It reports the same
/// error for a number that is too small and for one that is too large; a look at the decimal
/// exponent of the first significant digit distinguishes them.
#include "number.h"

#include <algorithm>
#include <charconv>
#include <cmath>
#include <cstddef>
#include <system_error>

namespace Meshes {

namespace {

/// Returns `word` without a leading '+', which `from_chars` does not accept.
std::string_view withoutPlus(std::string_view word) {
    if (word.size() > 1 && word[0] == '+' && word[1] != '-')
        word.remove_prefix(1);
    return word;
}

template <class T>
std::optional<T> parseWhole(std::string_view word) {
    T value = 0;
    const char* end = word.data() + word.size();
    const auto [stop, error] = std::from_chars(word.data(), end, value);
    return error == std::errc() && stop == end ? std::optional(value) : std::nullopt;
}

/// Returns whether the first significant digit of the number `word` is after the decimal point: a
/// number out of range is then too small, otherwise too large.
bool isSmall(std::string_view word) {
    const std::size_t exponentMark = word.find_first_of("eE");
    const std::string_view digits = word.substr(0, exponentMark);
    const std::size_t point = std::min(digits.find('.'), digits.size());
    const std::size_t first = digits.find_first_of("123456789");
    if (first == std::string_view::npos)
        return true;
    const auto place = static_cast<std::int64_t>(point) - static_cast<std::int64_t>(first);
    if (exponentMark == std::string_view::npos)
        return place <= 0;
    const std::string_view exponentText = word.substr(exponentMark + 1);
    const std::optional<std::int64_t> exponent = parseInteger(exponentText);
    // An exponent that does not fit 64 bits decides by its sign.
    return exponent ? place + *exponent <= 0 : exponentText.starts_with('-');
}

} // namespace

std::optional<float> parseFloat(std::string_view word) {
    word = withoutPlus(word);
    float value = 0;
    const char* end = word.data() + word.size();
    const auto [stop, error] = std::from_chars(word.data(), end, value);
    if (stop != end || error == std::errc::invalid_argument)
        return std::nullopt;
    if (error == std::errc::result_out_of_range)
        return isSmall(word) ? std::optional(0.0F) : std::nullopt;
    return std::isfinite(value) ? std::optional(value) : std::nullopt;
}

std::optional<std::uint32_t> parseUnsigned(std::string_view word) {
    return parseWhole<std::uint32_t>(word);
}

std::optional<std::int64_t> parseInteger(std::string_view word) {
    return parseWhole<std::int64_t>(withoutPlus(word));
}

bool isNumber(std::string_view word) {
    word = withoutPlus(word);
    double ignored = 0;
    const char* end = word.data() + word.size();
    const auto [stop, error] = std::from_chars(word.data(), end, ignored);
    return stop == end && error != std::errc::invalid_argument;
}

} // namespace Meshes
