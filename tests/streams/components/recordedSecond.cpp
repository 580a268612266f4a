// SPDX-License-Identifier: BSL-1.0
// A component library with one builder, for the tests of recorded lists.
#include "components/componentKit/componentKit.h"
#include "tests/streams/components/recordedUids.h"

namespace {

using namespace Mz;
using namespace Mz::Test;

class Plain final : public QrCastRef<QrCastHeap<QrCastImpl<Plain, QrComponentBuilder>>> {
  public:
    QrRef<QrCastable> createObject() override { return nullptr; }
};

} // namespace

MZ_COMPONENT(L"Second label", L"Second text",
             Kit::builderOf<Plain>({.uid = recordedGamma, .name = L"gamma", .number = 3}))
