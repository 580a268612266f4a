// SPDX-License-Identifier: BSL-1.0
/// Has an extension with a wildcard and a dot.
#include "tests/checks/components/broken.h"

class Builder final : public Mz::Test::Importing<Builder> {
  public:
    Builder() : Importing({L"*.broken"}) {}
};

MZ_BROKEN_BUILDER(Builder)
