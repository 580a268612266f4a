// SPDX-License-Identifier: BSL-1.0
/// A locale whose decimal separator is a comma, from whatever the system has.
#pragma once

#include <clocale>
#include <string>

namespace Mz::Test {

/// Makes a comma-decimal locale that of the process, for all categories; false when there is none.
bool setCommaLocale();

/// The comma-decimal locale for as long as it lives.
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
