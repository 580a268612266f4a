// SPDX-License-Identifier: BSL-1.0
/// Leaks memory each time that it is loaded.
#include "tests/checks/components/broken.h"

namespace {

char* const lost = new char[1000]{};

} // namespace

using Mz::Test::PlainDescription;

class Description final : public PlainDescription {
  public:
    using PlainDescription::PlainDescription;
    Mz::int64 getComponentValue() override { return lost[0] ? 0 : 1; }
};

MZ_BROKEN_DESCRIPTION(Description)
