// SPDX-License-Identifier: BSL-1.0
/// Its first object starts a thread that does not end. The thread waits in a library of the system,
/// because in a library that is unloaded it would crash.
#include "tests/checks/components/broken.h"

#include "tests/checks/components/system.h"

class Object final : public Mz::Test::Stored {
  public:
    Object() { [[maybe_unused]] static const bool started = Mz::Test::leaveThreadRunning(); }
};

MZ_BROKEN_OBJECT(Object)
