// SPDX-License-Identifier: BSL-1.0
/// Makes an object of another library, through the component manager, and does without it where it
/// is not installed.
#include "tests/checks/sound/thing.h"

#include "components/componentKit/manager.h"

using namespace Mz;
using namespace Mz::Test;

namespace {

class Doubled final : public Kit::Object<Doubled, Thing> {
  public:
    Doubled() : inner(Kit::create<Thing>(soundUid(1))) {}
    int value() const override { return inner ? 2 * inner->value() : 0; }

  private:
    QrPtr<Thing> inner;
};

} // namespace

MZ_COMPONENT(L"Doubled", L"Uses another library",
             Kit::builderOf<Doubled>({.uid = soundUid(10), .name = L"doubled"}))
