// SPDX-License-Identifier: BSL-1.0
/// Needs more thread-local memory than the loader has left for libraries that are loaded later.
#include "tests/checks/components/broken.h"

class Object final : public Mz::Test::Stored {
  public:
    Object() { number = room[4711]; }

  private:
    [[gnu::tls_model("initial-exec")]] static inline thread_local char room[1 << 20] = {};
};

MZ_BROKEN_OBJECT(Object)
