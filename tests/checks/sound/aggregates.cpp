// SPDX-License-Identifier: BSL-1.0
/// Without the templates: an inner object supplies an interface of the outer one, and shares its
/// identity and its references.
#include "tests/checks/sound/thing.h"

using namespace Mz;
using namespace Mz::Test;

namespace {

class Size : public QrCastable {
  public:
    using Self = Size;
    static constexpr QrUid uid = soundUid(0x2201);
    virtual int bytes() const = 0;
};

/// Answers everything by the object that contains it.
class InnerSize final : public Size {
  public:
    explicit InnerSize(QrCastable& whole) : outer(whole) {}
    long newReference() override { return outer.newReference(); }
    long release() override { return outer.release(); }
    QrCastable* getInterface(const QrUid& wanted) override { return outer.getInterface(wanted); }
    bool hasInterface(const QrUid& wanted) const override { return outer.hasInterface(wanted); }
    QrCastable* getCastable() override { return outer.getCastable(); }
    const QrCastable* getCastable() const override {
        return static_cast<const QrCastable&>(outer).getCastable();
    }
    void destroy() override {} // It is a part of the outer object.
    int bytes() const override { return 22; }

  private:
    QrCastable& outer;
};

class Whole final : public Kit::Object<Whole, Thing> {
  public:
    QrCastable* getInterface(const QrUid& wanted) override {
        if (!(wanted == Size::uid))
            return Object::getInterface(wanted);
        newReference();
        return &size;
    }
    bool hasInterface(const QrUid& wanted) const override {
        return wanted == Size::uid || Object::hasInterface(wanted);
    }
    int value() const override { return size.bytes(); }

  private:
    InnerSize size{*this};
};

} // namespace

MZ_COMPONENT(L"Whole", L"Aggregates another object",
             Kit::builderOf<Whole>({.uid = soundUid(22), .name = L"whole"}))
