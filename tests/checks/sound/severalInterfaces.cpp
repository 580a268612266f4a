// SPDX-License-Identifier: BSL-1.0
/// One object with three interfaces, of which one extends another.
#include "tests/checks/sound/thing.h"

using namespace Mz;
using namespace Mz::Test;

namespace {

class Named : public QrCastable {
  public:
    using Self = Named;
    static constexpr QrUid uid = soundUid(0x101);
    virtual const wchar_t* name() const = 0;
};

class Renamed : public Named {
  public:
    using Self = Renamed;
    static constexpr QrUid uid = soundUid(0x102);
    virtual const wchar_t* formerName() const = 0;
};

class Rich final : public Kit::Object<Rich, Thing, Renamed> {
  public:
    QrCastable* getInterface(const QrUid& wanted) override {
        if (wanted == Named::uid)
            return newReference(), static_cast<Named*>(this);
        return Object::getInterface(wanted);
    }
    bool hasInterface(const QrUid& wanted) const override {
        return wanted == Named::uid || Object::hasInterface(wanted);
    }
    int value() const override { return 3; }
    const wchar_t* name() const override { return L"rich"; }
    const wchar_t* formerName() const override { return L"richer"; }
};

} // namespace

MZ_COMPONENT(L"Several interfaces", L"One object, three interfaces",
             Kit::builderOf<Rich>({.uid = soundUid(1), .name = L"rich"}))
