// SPDX-License-Identifier: BSL-1.0
/// Running out of memory on request.
#pragma once

namespace Mz::Test {

/// While it lives, this thread's allocations fail after the first `allowed` ones. A Windows library
/// allocates by itself; there it is only the program's own that fail.
class FailingAllocations {
  public:
    explicit FailingAllocations(int allowed);
    ~FailingAllocations();
    FailingAllocations(const FailingAllocations&) = delete;
    FailingAllocations& operator=(const FailingAllocations&) = delete;
};

} // namespace Mz::Test
