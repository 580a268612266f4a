// SPDX-License-Identifier: BSL-1.0
// A component library without faults, written with the kit.
#include "components/componentKit/componentKit.h"
#include "tests/components/testUids.h"

using namespace Mz;

class KitObject final : public QrCastRef<QrCastHeap<QrCastImpl<KitObject, Test::PlainObject>>> {
  public:
    const char* maker() const override { return "kit"; }
};

MZ_COMPONENT(L"Kit label", L"Kit text",
             Kit::builderOf<KitObject>({.uid = Test::kitUid, .name = L"kit", .number = 7}))
