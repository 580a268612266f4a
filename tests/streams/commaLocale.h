// SPDX-License-Identifier: BSL-1.0
/// A locale of the system whose decimal separator is a comma.
#pragma once

#include <clocale>
#include <string>

namespace Mz::Test {

/// Sets a comma-decimal locale for the process, in all categories. Returns false if there is none.
bool setCommaLocale();

/// Sets the comma-decimal locale while it lives. Converts to false if there is none.
class CommaLocale {
  public:
    CommaLocale() : previous(std::setlocale(LC_ALL, nullptr)), isSet(setCommaLocale()) {}
    ~CommaLocale() { std::setlocale(LC_ALL, previous.c_str()); }
    CommaLocale(const CommaLocale&) = delete;
    CommaLocale& operator=(const CommaLocale&) = delete;

    explicit operator bool() const {
        return isSet && std::string(std::localeconv()->decimal_point) == ",";
    }

  private:
    std::string previous;
    bool isSet;
};

} // namespace Mz::Test
