// SPDX-License-Identifier: BSL-1.0
/// The locales for the tests of multibyte text. Each platform has its own list.
#pragma once

#include <clocale>
#include <string>
#include <vector>

namespace Mz::Test {

/// A multibyte encoding and test data for it.
struct MultibyteLocale {
    const char* name;      ///< for `setlocale`
    std::string character; ///< one character of at least two bytes; the first is a lead byte
    wchar_t code;          ///< the same character, wide
    std::string noText;    ///< four bytes of which no prefix is a character
    wchar_t codeWithoutForm;
};

/// Returns this platform's multibyte locales that the C runtime has; may be empty.
std::vector<MultibyteLocale> multibyteLocales();

/// A single-byte locale, and one byte with its character.
struct SingleByteLocale {
    const char* name;
    char byte;
    wchar_t code;
};

/// Returns this platform's single-byte locales that the C runtime has; may be empty.
std::vector<SingleByteLocale> singleByteLocales();

/// Sets the process's locale for characters while it lives.
class LocaleGuard {
  public:
    explicit LocaleGuard(const char* name)
        : previous(std::setlocale(LC_CTYPE, nullptr)),
          isSet(std::setlocale(LC_CTYPE, name) != nullptr) {}
    ~LocaleGuard() { std::setlocale(LC_CTYPE, previous.c_str()); }
    LocaleGuard(const LocaleGuard&) = delete;
    LocaleGuard& operator=(const LocaleGuard&) = delete;

    explicit operator bool() const { return isSet; }

  private:
    std::string previous;
    bool isSet;
};

} // namespace Mz::Test
