// SPDX-License-Identifier: BSL-1.0
/// What the sound libraries of this folder have in common: an interface, and a uid for each of
/// their builders. Each library does one thing that authors do, and does it well.
#pragma once

#include "components/componentKit/componentKit.h"
#include "components/componentManager/persistant.h"
#include "components/componentManager/stream.h"

namespace Mz::Test {

/// Returns the uid with that number in the family of the sound libraries.
constexpr QrUid soundUid(std::uint32_t number) {
    return {0x5F000000 + number, 0x7A9011EF, 0x8E4C3B00, 0x25D81FA6};
}

/// Something that can be asked for a number.
class Thing : public QrCastable {
  public:
    using Self = Thing;
    static constexpr QrUid uid = soundUid(0);

    virtual int value() const = 0;
};

/// A `Thing` that stores itself under the uid `soundUid(number)`. The derived class has `write` and
/// `read`.
template <class Impl, std::uint32_t number>
class StoredThing : public Kit::Object<Impl, Thing, QrPersistant> {
  public:
    static constexpr QrUid classUid = soundUid(number);

    const QrUid* getClassUid() const override { return &classUid; }
    unsigned int getVersion() const override { return 1; }
    int value() const override { return static_cast<int>(number); }
};

} // namespace Mz::Test
