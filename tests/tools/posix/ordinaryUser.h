// SPDX-License-Identifier: BSL-1.0
/// An ordinary user, for tests that may run as the superuser.
#pragma once

#include <unistd.h>

namespace Mz::Test {

/// While it lives, the process does not run as the superuser, whom permissions do not restrict.
class OrdinaryUser {
  public:
    OrdinaryUser() : previous(::geteuid()) {
        if (previous == 0)
            static_cast<void>(::seteuid(nobody));
    }
    ~OrdinaryUser() {
        if (previous == 0)
            static_cast<void>(::seteuid(0));
    }
    OrdinaryUser(const OrdinaryUser&) = delete;
    OrdinaryUser& operator=(const OrdinaryUser&) = delete;

  private:
    static constexpr uid_t nobody = 65534;
    uid_t previous;
};

} // namespace Mz::Test
