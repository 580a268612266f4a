// SPDX-License-Identifier: BSL-1.0
/// Lets allocations fail, where the program that checks replaces `operator new`.
#pragma once

namespace Mz::Tools {

/// What the program supplies.
struct AllocationLimit {
    /// Lets the allocations of this thread succeed so many times and then fail; -1 for no limit.
    void (*set)(int allowed);
    /// Returns whether an allocation failed since the limit was set.
    bool (*reached)();
};

/// Returns the limit, or null if the program cannot limit the allocations of libraries.
const AllocationLimit* allocationLimit();

/// Called by the program before any check. The limit must stay valid.
void setAllocationLimit(const AllocationLimit* limit);

} // namespace Mz::Tools
