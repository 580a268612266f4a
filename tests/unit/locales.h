// SPDX-License-Identifier: BSL-1.0
/// The locales in which multibyte text is tested; each platform has its own.
#pragma once

#include <clocale>
#include <string>
#include <vector>

namespace Mz::Test {

/// One encoding, and texts in it.
struct MultibyteLocale {
    const char* name;      ///< for `setlocale`
    std::string character; ///< one character of two bytes or more, the first of which says so
    wchar_t code;          ///< the same, wide
    std::string noText;    ///< four bytes that form no character, however many of them are taken
    wchar_t codeWithoutForm;
};

/// All of this platform's that the C runtime knows here; never empty where tests can run.
std::vector<MultibyteLocale> multibyteLocales();

/// A locale of single bytes that are not their own codes.
struct SingleByteLocale {
    const char* name;
    char byte;
    wchar_t code;
};

/// Empty where the C runtime has none.
std::vector<SingleByteLocale> singleByteLocales();

/// While it lives, the process has another locale for characters.
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
