// SPDX-License-Identifier: BSL-1.0
/// Interfaces and objects for the tests of the object model.
#pragma once

#include "components/componentManager/cast.h"

#include <string>
#include <vector>

namespace Mz::Test {

class Gauge : public QrCastable {
  public:
    using Self = Gauge;
    static constexpr QrUid uid{0x3C5A0001, 0x51C24E0B, 0x8F3D6A70, 0x1B9E0C55};
    virtual int value() const = 0;
};

class Dial : public QrCastable {
  public:
    using Self = Dial;
    static constexpr QrUid uid{0x3C5A0002, 0x51C24E0B, 0x8F3D6A70, 0x1B9E0C55};
    virtual int mark() const = 0;
};

/// An interface that derives from another interface.
class FineGauge : public Gauge {
  public:
    using Self = FineGauge;
    static constexpr QrUid uid{0x3C5A0003, 0x51C24E0B, 0x8F3D6A70, 0x1B9E0C55};
};

inline constexpr QrUid unknownUid{0x3C5A00FF, 0x51C24E0B, 0x8F3D6A70, 0x1B9E0C55};

using Log = std::vector<std::string>;

/// Not counted. Records the casts and references that it is asked for.
class Probe : public QrCastImpl<Probe, Gauge> {
  public:
    int value() const override { return 7; }
    QrCastable* getInterface(const QrUid& uid) override {
        ++asked;
        return QrCastImpl<Probe, Gauge>::getInterface(uid);
    }
    long newReference() override { return ++references; }
    long release() override { return --references; }

    int asked = 0;
    long references = 0;
};

/// A counted object. `alive` is the number of its instances.
class Counted : public QrCastRef<QrCastHeap<QrCastImpl<Counted, Gauge>>> {
  public:
    explicit Counted(int& alive) : alive(alive) { ++alive; }
    Counted(const Counted& other) : QrCastRef(other), alive(other.alive) { ++alive; }
    ~Counted() override { --alive; }
    int value() const override { return 7; }

  private:
    int& alive;
};

} // namespace Mz::Test
