// SPDX-License-Identifier: BSL-1.0
/// Returns a description again that its last release has ended.
#include "tests/checks/components/broken.h"

using Mz::Test::PlainDescription;

/// Counts until then, like a destroyed object whose base class is not counted.
class Description final : public PlainDescription {
  public:
    using PlainDescription::PlainDescription;
    long newReference() override { return ended ? 1 : ++references; }
    long release() override {
        if (ended)
            return 1;
        ended = --references < 0;
        return references;
    }

  private:
    long references = -1;
    bool ended = false;
};

MZ_BROKEN_DESCRIPTION(Description)
