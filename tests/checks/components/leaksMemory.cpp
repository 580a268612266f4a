// SPDX-License-Identifier: BSL-1.0
/// Makes objects that do not free what they allocate.
#include "tests/checks/components/broken.h"

class Object final : public Mz::Test::Stored {
  private:
    int* lost = new int[100];
};

MZ_BROKEN_OBJECT(Object)
