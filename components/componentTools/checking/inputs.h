// SPDX-License-Identifier: BSL-1.0
/// Input for import builders: empty, short, random, cut off, changed, and of foreign formats.
#pragma once

#include <cstddef>
#include <cstdint>
#include <filesystem>
#include <string>
#include <vector>

namespace Mz::Tools {

/// One input.
struct CheckInput {
    std::wstring name; ///< for people
    std::string bytes;
    bool valid = false; ///< a sample as it was given
};

/// A sequence of inputs without end, which depends on the seed and the samples only.
class CheckInputs {
  public:
    /// Reads the samples. Those that cannot be read are skipped.
    CheckInputs(std::uint32_t seed, const std::vector<std::filesystem::path>& samples);

    /// Returns the number of inputs that every check uses. Those after them are random.
    std::size_t fixedCount() const { return fixed.size() + changedCount; }

    /// Returns an input by its number.
    CheckInput at(std::size_t number) const;

  private:
    /// The number of changed inputs that every check uses.
    static constexpr std::size_t changedCount = 64;

    std::uint32_t seed;
    std::vector<CheckInput> fixed;
    std::size_t sampleCount = 0;
};

/// Returns `bytes` with a few changes, which depend on the two numbers only.
std::string changedBytes(std::string bytes, std::uint32_t seed, std::size_t number);

} // namespace Mz::Tools
