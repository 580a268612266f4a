// SPDX-License-Identifier: BSL-1.0
/// The persistent classes that the tests store and load, and the uids of their builders.
#pragma once

#include "components/componentManager/cast.h"

#include <string>
#include <vector>

namespace Mz::Test {

/// A node of a graph. Links are stored as objects; `links` has those that were read when the load
/// is finished.
class Node : public QrCastable {
  public:
    using Self = Node;
    static constexpr QrUid uid{0x3A5D1C00, 0x7E2B4F19, 0xB1C60A2D, 0x55AA1201};

    int number = 0;
    std::wstring name;
    bool flag = false;
    double weight = 0;
    std::vector<QrPtr<Node>> links;
};

/// Counts the existing nodes.
class Census : public QrCastable {
  public:
    using Self = Census;
    static constexpr QrUid uid{0x3A5D1C01, 0x7E2B4F19, 0xB1C60A2D, 0x55AA1201};

    virtual int alive() const = 0;
};

/// An interface that no object of the tests has.
class Stranger : public QrCastable {
  public:
    using Self = Stranger;
    static constexpr QrUid uid{0x3A5D1C02, 0x7E2B4F19, 0xB1C60A2D, 0x55AA1201};
};

constexpr QrUid classUid(std::uint32_t which) {
    return {0x3A5D1C10 + which, 0x7E2B4F19, 0xB1C60A2D, 0x55AA1201};
}

inline constexpr QrUid censusUid = classUid(0);
/// A node that writes its name exactly, and all other members.
inline constexpr QrUid nodeUid = classUid(1);
/// A node that stores its number, and its name as a plain string.
inline constexpr QrUid stringUid = classUid(2);
inline constexpr QrUid wideUid = classUid(20);
/// A node that a companion stores.
inline constexpr QrUid companionUid = classUid(3);
/// A node whose builder returns it by another interface than its first.
inline constexpr QrUid viewedUid = classUid(4);
/// A node that requests its notification while only the reader owns it.
inline constexpr QrUid selfishUid = classUid(5);
/// A node that reads an object and ignores its failure.
inline constexpr QrUid carelessUid = classUid(6);

/// Builders with faults: another class, an object that is not persistent, null, an exception.
inline constexpr QrUid otherClassUid = classUid(7);
inline constexpr QrUid notPersistentUid = classUid(8);
inline constexpr QrUid makesNullUid = classUid(9);
inline constexpr QrUid throwingUid = classUid(10);

/// A node that replaces the exception of an object in it by another one, without a position.
inline constexpr QrUid misleadingUid = classUid(11);

/// A node that casts null when it is read.
inline constexpr QrUid miscastUid = classUid(14);

/// A node that stores its number and its links, and owns the links as soon as it has read them.
inline constexpr QrUid holderUid = classUid(12);

/// A node that writes a value for each letter of its name, and expects the same values when it is
/// read.
inline constexpr QrUid spelledUid = classUid(13);

/// No builder has this uid.
inline constexpr QrUid unknownUid = classUid(0x99);

} // namespace Mz::Test
