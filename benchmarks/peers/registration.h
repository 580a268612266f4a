// SPDX-License-Identifier: BSL-1.0
/// How a peer, another library that does the same work, comes into the table.
#pragma once

#include "ratioTable.h"

#include <vector>

namespace Mz::Benchmarks {

/// Adds the lines of a peer to the table. Define one at namespace scope in the source of the peer:
/// the program measures the peers whose sources are compiled into it.
class PeerRegistration {
  public:
    using Add = void (*)(RatioTable&);

    explicit PeerRegistration(Add add) { all().push_back(add); }

    /// Adds all peers. The table must contain the comparisons.
    static void addAll(RatioTable& table) {
        for (const Add add : all())
            add(table);
    }

  private:
    static std::vector<Add>& all() {
        static std::vector<Add> functions;
        return functions;
    }
};

} // namespace Mz::Benchmarks
