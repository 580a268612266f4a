// SPDX-License-Identifier: BSL-1.0
/// Has an extension in capital letters only.
#include "tests/checks/components/broken.h"

class Builder final : public Mz::Test::Importing<Builder> {
  public:
    Builder() : Importing({L"BROKEN"}) {}
};

MZ_BROKEN_BUILDER(Builder)
