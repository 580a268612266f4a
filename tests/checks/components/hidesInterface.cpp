// SPDX-License-Identifier: BSL-1.0
/// Makes objects that have an interface of which hasInterface knows nothing.
#include "tests/checks/components/broken.h"

class Object final : public Mz::Test::Stored {
  public:
    bool hasInterface(const Mz::QrUid&) const override { return false; }
};

MZ_BROKEN_OBJECT(Object)
