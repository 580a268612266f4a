// SPDX-License-Identifier: BSL-1.0
/// A process that can open no further file (POSIX), whatever the reason.
#pragma once

namespace Mz::Test {

/// While one lives, `open` fails with `error` in the program that this is linked into, and in its
/// libraries. Limiting the process's descriptors instead would also stop what the sanitizers open.
class FailingOpen {
  public:
    explicit FailingOpen(int error);
    ~FailingOpen();
    FailingOpen(const FailingOpen&) = delete;
    FailingOpen& operator=(const FailingOpen&) = delete;
};

} // namespace Mz::Test
