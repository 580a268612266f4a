/// Running out of memory on request.
#pragma once

namespace Mz::Test {

/// While it lives, this thread's allocations fail after the first `allowed` ones.
class FailingAllocations {
  public:
    explicit FailingAllocations(int allowed);
    ~FailingAllocations();
    FailingAllocations(const FailingAllocations&) = delete;
    FailingAllocations& operator=(const FailingAllocations&) = delete;

    /// Whether allocations inside the tested libraries fail too, or only this program's own: a
    /// Windows library never looks into the program for its operator new.
    static bool reachLibraries();
};

} // namespace Mz::Test
