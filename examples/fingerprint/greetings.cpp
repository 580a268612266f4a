// SPDX-License-Identifier: BSL-1.0
/// A component that was built with the interface as it is now.
#include "components/componentKit/componentKit.h"
#include "greeter.h"

using namespace Mz;

namespace {

class EnglishGreeter final : public Kit::Object<EnglishGreeter, Greeter> {
  public:
    std::string language() const override { return "English"; }
    std::string greeting(const std::string& name) const override { return "Hello, " + name + "!"; }
};

} // namespace

MZ_COMPONENT(L"Greetings", L"Says hello in English",
             Kit::builderOf<EnglishGreeter>({.uid = englishGreeterUid, .name = L"greeter"}))
