// SPDX-License-Identifier: BSL-1.0
/// A component that was built with the first version of the interface. A host with the second
/// version would call `greeting` where it means `language`, with too few arguments.
#include "components/componentKit/componentKit.h"
#include "greeter.h"

using namespace Mz;

namespace {

class FrenchGreeter final : public Kit::Object<FrenchGreeter, Greeter> {
  public:
    std::string greeting(const std::string& name) const override { return "Bonjour, " + name; }
};

} // namespace

MZ_COMPONENT(L"Old greetings", L"Says hello in French",
             Kit::builderOf<FrenchGreeter>({.uid = frenchGreeterUid, .name = L"greeter"}))
