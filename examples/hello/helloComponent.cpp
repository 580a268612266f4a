// SPDX-License-Identifier: BSL-1.0
#include "greeter.h"

#include "components/componentKit/componentKit.h"

using namespace Mz;

class WorldGreeter final : public QrCastRef<QrCastHeap<QrCastImpl<WorldGreeter, Greeter>>> {
  public:
    const char* greeting() const override { return "Hello, world!"; }
};

MZ_COMPONENT(L"Greetings", L"The smallest component",
             Kit::builderOf<WorldGreeter>({.uid = worldGreeterUid, .name = L"greeter"}))
