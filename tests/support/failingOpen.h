// SPDX-License-Identifier: BSL-1.0
/// Makes opening a file fail on POSIX systems.
#pragma once

namespace Mz::Test {

/// While it lives, `open` fails with `error` in this program and its libraries. A limit on the
/// process's descriptors would also affect the files of the sanitizers.
class FailingOpen {
  public:
    explicit FailingOpen(int error);
    ~FailingOpen();
    FailingOpen(const FailingOpen&) = delete;
    FailingOpen& operator=(const FailingOpen&) = delete;
};

} // namespace Mz::Test
