// SPDX-License-Identifier: BSL-1.0
/// The persistent classes that the tests store and load, and the builders that make them.
#pragma once

#include "components/componentManager/cast.h"

#include <string>
#include <vector>

namespace Mz::Test {

/// A node of a graph, with all that the tests want to see of it. Links are stored as objects; those
/// that were read are in `links` once the load is finished.
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

/// Knows how many nodes exist.
class Census : public QrCastable {
  public:
    using Self = Census;
    static constexpr QrUid uid{0x3A5D1C01, 0x7E2B4F19, 0xB1C60A2D, 0x55AA1201};

    virtual int alive() const = 0;
};

/// An interface that no object of these has by itself.
class Stranger : public QrCastable {
  public:
    using Self = Stranger;
    static constexpr QrUid uid{0x3A5D1C02, 0x7E2B4F19, 0xB1C60A2D, 0x55AA1201};
};

constexpr QrUid classUid(std::uint32_t which) {
    return {0x3A5D1C10 + which, 0x7E2B4F19, 0xB1C60A2D, 0x55AA1201};
}

inline constexpr QrUid censusUid = classUid(0);
/// A node that writes its name exactly, and writes `weight` and `flag` in the middle of the rest.
inline constexpr QrUid nodeUid = classUid(1);
/// A node that stores its name as a plain string, and nothing else.
inline constexpr QrUid stringUid = classUid(2);
inline constexpr QrUid wideUid = classUid(20);
/// A node whose storing is the work of a companion.
inline constexpr QrUid companionUid = classUid(3);
/// A node of the second library. Its builder gives it out as another interface than its first.
inline constexpr QrUid viewedUid = classUid(4);
/// A node that asks to be told while nobody but the reader holds it.
inline constexpr QrUid selfishUid = classUid(5);
/// A node that reads an object inside it and goes on whatever becomes of that.
inline constexpr QrUid carelessUid = classUid(6);

/// Builders that do not give what they should.
inline constexpr QrUid otherClassUid = classUid(7);
inline constexpr QrUid notPersistentUid = classUid(8);
inline constexpr QrUid makesNullUid = classUid(9);
inline constexpr QrUid throwingUid = classUid(10);

/// A node that answers the failure of an object inside it with one of its own, without a place.
inline constexpr QrUid misleadingUid = classUid(11);

/// A node that stores its number and its links, and holds those as soon as it has read them.
inline constexpr QrUid holderUid = classUid(12);

/// A node that writes a value for each letter of its name, and demands them back as they were.
inline constexpr QrUid spelledUid = classUid(13);

/// No builder has this one.
inline constexpr QrUid unknownUid = classUid(0x99);

} // namespace Mz::Test
