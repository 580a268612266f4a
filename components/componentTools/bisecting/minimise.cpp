// SPDX-License-Identifier: BSL-1.0
/// Delta debugging by binary searches. Of the items in their order, the shortest prefix that fails
/// ends with an item that is needed. That item is kept, the items after it are dropped, and the
/// search is repeated among the items before it, until the kept items fail by themselves. Each
/// needed item so costs one binary search, where halving the set and its complements costs many
/// tests as soon as two items must come together.
///
/// Both ends of each binary search are sets that were tested. The search is therefore right for
/// every kind of test, such as one in which an item prevents a failure. A last pass removes items
/// that are superfluous: those that a mistaken test added, or that others replace.
#include "components/componentTools/bisecting/minimise.h"

#include <algorithm>
#include <map>
#include <numeric>

namespace Mz::Tools {

namespace {

struct Stopped {};

class Search {
  public:
    Search(std::size_t count, const SubsetTest& test, bool doubtful)
        : all(count), test(test), doubtful(doubtful) {
        std::iota(all.begin(), all.end(), std::size_t{0});
    }

    Minimum run() {
        try {
            return find();
        } catch (const Stopped&) {
            return {Minimum::State::stopped, smallest};
        }
    }

  private:
    Minimum find() {
        if (!fails(all))
            return {Minimum::State::allPass, {}};
        Subset needed = collect();
        dropSuperfluous(needed);
        if ((doubtful || !anyPassed) && fails({}))
            return {Minimum::State::noneFails, {}};
        return {Minimum::State::found, needed};
    }

    /// Returns items that fail together. `needed` and `rest` together always fail.
    Subset collect() {
        Subset needed, rest = all;
        while (!rest.empty() && (needed.empty() || !fails(needed))) {
            std::size_t passing = 0, failing = rest.size();
            while (failing - passing > 1) {
                const std::size_t middle = passing + (failing - passing) / 2;
                (fails(joined(needed, rest, middle)) ? failing : passing) = middle;
            }
            // The other needed items come before this one.
            needed.insert(needed.begin(), rest[failing - 1]);
            rest.resize(failing - 1);
        }
        return needed;
    }

    void dropSuperfluous(Subset& needed) {
        for (std::size_t index = 0; index < needed.size() && needed.size() > 1;) {
            Subset without = needed;
            without.erase(without.begin() + static_cast<std::ptrdiff_t>(index));
            if (fails(without)) {
                needed = std::move(without);
                index = 0; // An item that was needed may not be any more.
            } else {
                ++index;
            }
        }
    }

    static Subset joined(const Subset& needed, const Subset& rest, std::size_t size) {
        Subset set(rest.begin(), rest.begin() + static_cast<std::ptrdiff_t>(size));
        set.insert(set.end(), needed.begin(), needed.end()); // Greater than all of the rest.
        return set;
    }

    bool fails(const Subset& set) {
        if (const auto known = results.find(set); known != results.end())
            return known->second;
        const std::optional<bool> result = test(set);
        if (!result)
            throw Stopped();
        results.emplace(set, *result);
        anyPassed = anyPassed || !*result;
        if (*result && (smallest.empty() || set.size() < smallest.size()))
            smallest = set;
        return *result;
    }

    Subset all, smallest;
    const SubsetTest& test;
    const bool doubtful;
    bool anyPassed = false;
    std::map<Subset, bool> results;
};

} // namespace

Minimum minimise(std::size_t count, const SubsetTest& fails, bool doubtful) {
    return Search(count, fails, doubtful).run();
}

} // namespace Mz::Tools
