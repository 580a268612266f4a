// SPDX-License-Identifier: BSL-1.0
/// Finds a smallest set of items that fails a test: one item, or several that fail only together.
#pragma once

#include <cstddef>
#include <functional>
#include <optional>
#include <vector>

namespace Mz::Tools {

/// A set of items: their indices, ascending.
using Subset = std::vector<std::size_t>;

/// Returns whether a set of items fails; `std::nullopt` to stop the search.
using SubsetTest = std::function<std::optional<bool>(const Subset&)>;

/// The result of `minimise`.
struct Minimum {
    enum class State {
        found,
        allPass,   ///< not even the set of all items fails
        noneFails, ///< the empty set fails, so the items are not the reason
        stopped,   ///< the test stopped the search
    };
    State state = State::stopped;
    /// If found, a set that fails, without a superfluous item. If stopped, the smallest set that
    /// was seen to fail. Otherwise empty.
    Subset items;
};

/// Returns a smallest failing set of the items 0 to `count` - 1. Passes no set to `fails` twice.
///
/// "Smallest" means that the set passes without any one of its items. The test may be of any kind;
/// if adding an item never makes a failing set pass, a set of k items is found by at most
/// k (ceil(log2(count)) + 1) + k + 1 tests. For one item that is ceil(log2(count)) + 2.
///
/// A test that fails only sometimes must be repeated by `fails`. If it reports by mistake that a
/// set passes, the search takes more tests and finds the item later.
///
/// \param doubtful  whether `fails` may be mistaken about a set that passes. The empty set is then
///     always tested, else only if no other set passes
/// \throws whatever `fails` throws
Minimum minimise(std::size_t count, const SubsetTest& fails, bool doubtful = false);

} // namespace Mz::Tools
