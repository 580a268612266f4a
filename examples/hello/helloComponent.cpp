// SPDX-License-Identifier: BSL-1.0
#include "components/componentKit/componentKit.h"
#include "greeter.h"

using namespace Mz;

class WorldGreeter final : public Kit::Object<WorldGreeter, Greeter> {
  public:
    const char* greeting() const override { return "Hello, world!"; }
};

MZ_COMPONENT(L"Greetings", L"The smallest component",
             Kit::builderOf<WorldGreeter>({.uid = worldGreeterUid, .name = L"greeter"}))
