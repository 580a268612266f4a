// SPDX-License-Identifier: BSL-1.0
/// A component with a text that the "C" locale cannot represent.
#include "tests/kit/shapes.h"

#include "components/componentKit/componentKit.h"

using namespace Mz;
using namespace Mz::Test;

namespace {

class Point final : public Kit::Object<Point, Shape> {
  public:
    int corners() const override { return 1; }
};

} // namespace

MZ_COMPONENT(L"Foreign", L"", Kit::builderOf<Point>({.uid = squareUid, .name = L"\u65E5\u672C"}))
