// SPDX-License-Identifier: BSL-1.0
/// Leaks memory each time that it is loaded, once it was loaded often: a few rounds show nothing.
#include "tests/checks/components/broken.h"

#include "tests/support/journal.h"

namespace {

char* leakLater() {
    constexpr int often = 110;
    Mz::Test::note("loaded"); // The journal stays loaded.
    return Mz::Test::noted("loaded") > often ? new char[1000]{} : nullptr;
}

char* const lost = leakLater();

using Mz::Test::PlainDescription;

class Description final : public PlainDescription {
  public:
    using PlainDescription::PlainDescription;
    Mz::int64 getComponentValue() override { return lost && lost[0] ? 0 : 1; }
};

} // namespace

MZ_BROKEN_DESCRIPTION(Description)
