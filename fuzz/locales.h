// SPDX-License-Identifier: BSL-1.0
/// The locales by which the readers convert characters and numbers. An input of a target chooses
/// one.
#pragma once

#include <array>
#include <string>

namespace Mz::Fuzz {

/// Returns this system's names of four locales: "C", one with characters of up to four bytes, one
/// with characters of two bytes, and one with a decimal comma.
const std::array<std::string, 4>& localeNames();

/// Sets the process's locale to the one with the number `choice`, modulo their count; to "C" if the
/// system lacks it. The locale stays, because setting it takes longer than many an input.
void chooseLocale(unsigned int choice);

} // namespace Mz::Fuzz
