// SPDX-License-Identifier: BSL-1.0
/// Makes allocations fail on request.
#pragma once

namespace Mz::Test {

/// While it lives, this thread's allocations fail after the first `allowed` ones. On Windows,
/// libraries have their own operator new, so only the program's own allocations fail.
class FailingAllocations {
  public:
    explicit FailingAllocations(int allowed);
    ~FailingAllocations();
    FailingAllocations(const FailingAllocations&) = delete;
    FailingAllocations& operator=(const FailingAllocations&) = delete;
};

} // namespace Mz::Test
