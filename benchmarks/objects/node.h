// SPDX-License-Identifier: BSL-1.0
/// The objects that the benchmarks save and load.
#pragma once

#include "components/componentManager/cast.h"

namespace Mz::Benchmarks {

/// A node of a graph: two values and a reference to another node.
class Node : public QrCastable {
  public:
    using Self = Node;
    static constexpr QrUid uid{0x7B3C1E04, 0x53A011EF, 0x8D4E20C9, 0x6F10B277};

    /// `link` may be null. The node takes a reference to it.
    virtual void set(int number, double value, Node* link) = 0;
    virtual int number() const = 0;
    virtual double value() const = 0;
    /// Returns the node that this one refers to, or null. Takes no reference for the caller.
    virtual Node* link() const = 0;
};

/// The class of the stored nodes, and the uid of its builder.
inline constexpr QrUid storedNodeUid{0x7B3C1E05, 0x53A011EF, 0x8D4E20C9, 0x6F10B277};

} // namespace Mz::Benchmarks
