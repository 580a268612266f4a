// SPDX-License-Identifier: BSL-1.0
/// Throws exceptions of its class and of the standard library, and catches all of them.
#include "tests/checks/sound/thing.h"

#include <stdexcept>
#include <string>

using namespace Mz;
using namespace Mz::Test;

namespace {

struct NoNumber {};

int parse(const std::string& text) {
    try {
        return std::stoi(text);
    } catch (const std::logic_error&) {
        throw NoNumber();
    }
}

class Parser final : public Kit::Object<Parser, Thing> {
  public:
    Parser() {
        for (const char* text : {"12", "twelve", "99999999999999999999"})
            try {
                sum += parse(text);
            } catch (NoNumber) {
                ++failures;
            }
    }
    int value() const override { return sum + failures; }

  private:
    int sum = 0, failures = 0;
};

} // namespace

MZ_COMPONENT(L"Parser", L"Catches what it throws",
             Kit::builderOf<Parser>({.uid = soundUid(13), .name = L"parser"}))
