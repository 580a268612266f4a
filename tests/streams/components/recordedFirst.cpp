// SPDX-License-Identifier: BSL-1.0
// A component library with two builders, for the tests of recorded lists.
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

MZ_COMPONENT(L"First label", L"First text",
             Kit::builderOf<Plain>({.uid = recordedAlpha,
                                    .name = L"alpha",
                                    .label = L"Alpha",
                                    .text = L"The first of two",
                                    .number = 4000000000,
                                    .flag = true}),
             Kit::builderOf<Plain>({.uid = recordedBeta, .name = L"beta"}))
