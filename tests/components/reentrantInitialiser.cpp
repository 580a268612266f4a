// SPDX-License-Identifier: BSL-1.0
/// Asks the manager for its own builder while it is loaded.
#include "tests/components/testUids.h"

using namespace Mz;
using namespace Mz::Test;

namespace {

class Description final : public PlainDescription {
  public:
    Description() : PlainDescription("initialiser", {{reentrantInitialiserUid, L"initialiser"}}) {}
};

struct AsksForItself {
    AsksForItself() {
        if (!managerUnderTest())
            return;
        note("asked");
        if (managerUnderTest()->getBuilder(reentrantInitialiserUid))
            note("answered");
    }
    ~AsksForItself() { note("unloaded"); }
} asksForItself;

} // namespace

MZ_PLAIN_ENTRY_POINT(Description)
