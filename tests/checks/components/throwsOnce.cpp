// SPDX-License-Identifier: BSL-1.0
/// Has a description whose release throws once, if there are four references.
#include "tests/checks/components/broken.h"

#include <stdexcept>

using Mz::Test::PlainDescription;

class Description final : public PlainDescription {
  public:
    using PlainDescription::PlainDescription;
    long newReference() override { return ++references; }
    long release() override {
        if (references == 3 && !thrown) {
            thrown = true;
            throw std::runtime_error("too many references");
        }
        return --references;
    }

  private:
    long references = -1;
    bool thrown = false;
};

MZ_BROKEN_DESCRIPTION(Description)
