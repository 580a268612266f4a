// SPDX-License-Identifier: BSL-1.0
/// Mistakes in a component, one at a time, and what is right beside each.
#include "components/componentKit/componentKit.h"
#include "components/componentKit/hostKit.h"

using namespace Mz;

class Gauge : public QrCastable {
  public:
    using Self = Gauge;
    static constexpr QrUid uid = "3C5A0001-51C2-4E0B-8F3D-6A701B9E0C55"_uid;
    virtual int value() const { return 0; }
};
class OtherGauge : public QrCastable {
  public:
    using Self = OtherGauge;
    static constexpr QrUid uid = "3C5A0002-51C2-4E0B-8F3D-6A701B9E0C55"_uid;
};
class WithoutUid : public QrCastable {
  public:
    using Self = WithoutUid;
};
class WithoutSelf : public QrCastable {
  public:
    static constexpr QrUid uid = "3C5A0003-51C2-4E0B-8F3D-6A701B9E0C55"_uid;
};
class InheritsSelf : public Gauge {
  public:
    static constexpr QrUid uid = "3C5A0004-51C2-4E0B-8F3D-6A701B9E0C55"_uid;
};
class NotCastable {
  public:
    using Self = NotCastable;
    static constexpr QrUid uid = "3C5A0005-51C2-4E0B-8F3D-6A701B9E0C55"_uid;
};

constexpr QrUid oneUid = "3C5A0011-51C2-4E0B-8F3D-6A701B9E0C55"_uid;
constexpr QrUid otherUid = "3C5A0012-51C2-4E0B-8F3D-6A701B9E0C55"_uid;

class One final : public Kit::Object<One, Gauge> {};
class Both final : public Kit::Object<Both, Gauge, OtherGauge> {};
class ByHand final : public QrCastRef<QrCastHeap<QrCastImpl<ByHand, Gauge>>> {};

/// Counts by itself, without a template.
class CountsItself : public QrCastImpl<CountsItself, Gauge> {
  public:
    long newReference() override { return ++count; }
    long release() override { return --count; }

  private:
    long count = -1;
};

class SelfDescribed final : public Kit::Builder<SelfDescribed> {
  public:
    static constexpr QrUid builderUid = oneUid;
    SelfDescribed() : Builder({.uid = builderUid}) {}
    explicit SelfDescribed(int) : SelfDescribed() {}
    QrRef<QrCastable> createObject() override { return nullptr; }
};

#ifdef REFUSAL_objectWithoutUid
class Wrong final : public Kit::Object<Wrong, Gauge, WithoutUid> {};
#endif
#ifdef REFUSAL_objectWithoutSelf
class Wrong final : public Kit::Object<Wrong, WithoutSelf> {};
#endif
#ifdef REFUSAL_objectInheritingSelf
class Wrong final : public Kit::Object<Wrong, InheritsSelf> {};
#endif
#ifdef REFUSAL_objectOfNoCastable
class Wrong final : public Kit::Object<Wrong, Gauge, NotCastable> {};
#endif
#ifdef REFUSAL_objectWithoutInterface
class Wrong final : public Kit::Object<Wrong> {};
constexpr auto size = sizeof(Wrong);
#endif

// Classes that are made of the templates beneath the kit are checked where they are registered.
#ifdef REFUSAL_registeredWithoutUid
class Wrong final : public QrCastRef<QrCastHeap<QrCastImpl<Wrong, WithoutUid>>> {};
const Kit::OwnedBuilder wrong = Kit::builderOf<Wrong>({.uid = oneUid});
#endif
#ifdef REFUSAL_registeredInheritingSelf
class Wrong final : public QrCastRef<QrCastHeap<QrCastMulti<Wrong, OtherGauge, InheritsSelf>>> {};
const Kit::OwnedBuilder wrong = Kit::builderOf<Wrong>({.uid = oneUid});
#endif
#ifdef REFUSAL_uncounted
class Wrong final : public QrCastImpl<Wrong, Gauge> {};
const Kit::OwnedBuilder wrong = Kit::builderOf<Wrong>({.uid = oneUid});
#endif
#ifdef REFUSAL_uncountedMulti
class Wrong final : public QrCastHeap<QrCastMulti<Wrong, Gauge, OtherGauge>> {};
const Kit::OwnedBuilder wrong = Kit::builderOf<Wrong>({.uid = oneUid});
#endif
#ifdef REFUSAL_noDefaultConstructor
class Wrong final : public Kit::Object<Wrong, Gauge> {
  public:
    explicit Wrong(int) {}
};
const Kit::OwnedBuilder wrong = Kit::builderOf<Wrong>({.uid = oneUid});
#endif
#ifdef REFUSAL_abstract
class Wrong : public Kit::Object<Wrong, Gauge> {
    virtual void missing() = 0;
};
const Kit::OwnedBuilder wrong = Kit::builderOf<Wrong>({.uid = oneUid});
#endif
#ifdef REFUSAL_noCastable
class Wrong {};
const Kit::OwnedBuilder wrong = Kit::builderOf<Wrong>({.uid = oneUid});
#endif
#ifdef REFUSAL_noUid
const Kit::OwnedBuilder wrong = Kit::builderOf<One>({.name = L"gauge"});
#endif
#ifdef REFUSAL_nilUid
const Kit::OwnedBuilder wrong = Kit::builderOf<One>({.uid = QrUid{}, .name = L"gauge"});
#endif

#ifdef REFUSAL_sameUid
#define OTHER_UID oneUid
#else
#define OTHER_UID otherUid
#endif
#ifdef REFUSAL_sameUidOfBuilder
#define MORE_BUILDERS , Kit::builder<SelfDescribed>()
#else
#define MORE_BUILDERS
#endif
#ifdef REFUSAL_runTimeUid // Not a mistake, but the limit of the comparison.
const QrUid runTimeUid = oneUid;
MZ_COMPONENT(L"Gauges", L"", Kit::builderOf<One>({.uid = oneUid}),
             Kit::builderOf<Both>({.uid = Kit::BuilderUid::atRunTime(runTimeUid)}),
             Kit::builder<SelfDescribed>(7), Kit::builderOf<CountsItself>({.uid = otherUid}))
#else
MZ_COMPONENT(L"Gauges", L"", Kit::builderOf<One>({.uid = oneUid, .name = L"gauge"}),
             Kit::builderOf<Both>({.uid = OTHER_UID}) MORE_BUILDERS)
#endif

#ifdef REFUSAL_uidTooShort
constexpr QrUid wrong = "6E1B0A01-4D1F-11EF-9C2A-7B105D3E8F"_uid;
#endif
#ifdef REFUSAL_uidDigit
constexpr QrUid wrong = "6E1B0A01-4D1F-11EF-9C2A-7B105D3E8FG1"_uid;
#endif
#ifdef REFUSAL_uidHyphen
constexpr QrUid wrong = "6E1B0A014-D1F-11EF-9C2A-7B105D3E8F41"_uid;
#endif
#ifdef REFUSAL_uidAtRunTime
QrUid parsed(const char* text) {
    return operator""_uid(text, 36);
}
#endif

#ifdef REFUSAL_namelessImporter
const auto importer = Kit::newImporter<L"">();
#endif
#ifdef REFUSAL_translationWithoutInterface
void translate(QrCastable& object) {
    Kit::Translation<> wrong(object, object);
}
#endif
#ifdef REFUSAL_translationWithoutSelf
void translate(QrCastable& object) {
    Kit::Translation<WithoutSelf> wrong(object, object);
}
#endif
#ifdef REFUSAL_visitorResult
void visit() {
    Kit::forEachBuilder([](const QrBuilderDescription&) { return true; });
}
#endif
#ifdef REFUSAL_createdClass
const auto created = Kit::create<One>(oneUid);
#endif

// The list of operations of MZ_INTERFACE.
class Meter : public Gauge {
  public:
    using Self = Meter;
    static constexpr QrUid uid = "3C5A0006-51C2-4E0B-8F3D-6A701B9E0C55"_uid;
    virtual int reading() const = 0;
    virtual void set(int value) = 0;
    virtual void set(double value) = 0;
    int twice() const { return 2 * reading(); }

  private:
    virtual void hidden();
};
#ifdef REFUSAL_fingerprint
MZ_INTERFACE(Meter, MZ_OPERATION(set, void(int)), reading, MZ_OPERATION(set, void(double)),
             MZ_BASE(Gauge))
MZ_INTERFACE(Gauge, value);
MZ_INTERFACE(OtherGauge)
#endif
#ifdef REFUSAL_fingerprintOfOverload
MZ_INTERFACE(Meter, reading, set)
#endif
#ifdef REFUSAL_fingerprintMisspelled
MZ_INTERFACE(Meter, raeding)
#endif
#ifdef REFUSAL_fingerprintOfPrivate
MZ_INTERFACE(Meter, hidden)
#endif
#ifdef REFUSAL_fingerprintSignature
MZ_INTERFACE(Meter, MZ_OPERATION(set, void(long)))
#endif
#ifdef REFUSAL_fingerprintOfNoVirtual
MZ_INTERFACE(Meter, reading, twice)
#endif
#ifdef REFUSAL_fingerprintOfBase
MZ_INTERFACE(Meter, reading, value)
#endif
#ifdef REFUSAL_fingerprintNoBase
MZ_INTERFACE(Meter, MZ_BASE(OtherGauge))
#endif
#ifdef REFUSAL_fingerprintBaseWithoutFunctions
struct Plain {};
class Derived : public Gauge, public Plain {
  public:
    using Self = Derived;
    static constexpr QrUid uid = "3C5A0007-51C2-4E0B-8F3D-6A701B9E0C55"_uid;
};
MZ_INTERFACE(Derived, MZ_BASE(Plain))
#endif
#ifdef REFUSAL_fingerprintWithoutSelf
MZ_INTERFACE(WithoutSelf)
#endif
