// SPDX-License-Identifier: BSL-1.0
// A client that instantiates every template of the headers. The test compiles it with many
// warnings: headers found through `-I` must compile without any.
#include "components/componentKit/componentKit.h"
#include "components/componentKit/hostKit.h"
#include "components/componentManager/binaryStream.h"
#include "components/componentManager/importer.h"
#include "components/componentManager/persistant.h"
#include "components/componentManager/processControl.h"
#include "components/componentManager/textStream.h"
#include "components/componentTools/explain.h"
#include "components/componentTools/fingerprints.h"
#include "components/componentTools/scan.h"
#include "components/objectIO/objectIO.h"

namespace {

using namespace Mz;

class Gauge : public QrCastable {
  public:
    using Self = Gauge;
    static constexpr QrUid uid{0x5C0A77E1, 0x2F1B11EF, 0x9D3A6C20, 0x81F0B365};

    virtual int value() const = 0;
};

class Listed : public Gauge {
  public:
    using Self = Listed;
    static constexpr QrUid uid{0x5C0A77E2, 0x2F1B11EF, 0x9D3A6C20, 0x81F0B365};

    virtual QrRef<Listed> next() const noexcept = 0;
    virtual void set(int number) = 0;
    virtual void set(double number) = 0;
};
MZ_INTERFACE(Gauge, value)
MZ_INTERFACE(Listed, next, MZ_OPERATION(set, void(int)), MZ_OPERATION(set, void(double)),
             MZ_BASE(Gauge))

class Static final : public QrCastImpl<Static, Gauge> {
  public:
    int value() const override { return 1; }
};

/// Has private functions for counting.
class Private : public QrCastImpl<Private, Gauge> {
  public:
    int value() const override { return count; }

  private:
    long newReference() override { return ++count; }
    long release() override { return --count; }

    int count = 0;
};

class Owner;

class Companion final
    : public QrTempObject<Owner, QrCastRef<QrCastHeap<QrCastImpl<Companion, QrPersistant>>>> {
  public:
    explicit Companion(Owner* owner);
    const QrUid* getClassUid() const override { return &Gauge::uid; }
    unsigned int getVersion() const override { return 1; }
    void write(QrStream& stream) override { stream << 1; }
    void read(QrStream& stream) override {
        int number = 0;
        stream >> number;
    }
};

/// Does not use `QrCastHeap`: its companions would delete it with their `destroy`.
class Owner final : public QrCastRef<QrCastImpl2<Owner, Gauge, QrTempIface<Owner, Companion>>> {
  public:
    int value() const override { return 3; }
};

Companion::Companion(Owner* owner) : QrTempObject(owner) {}

class Both final : public QrCastRef<QrCastHeap<QrCastMulti<Both, Gauge, QrPersistant>>> {
  public:
    int value() const override { return 4; }
    const QrUid* getClassUid() const override { return &Gauge::uid; }
    unsigned int getVersion() const override { return 1; }
    void write(QrStream&) override {}
    void read(QrStream&) override {}
};

class Files final : public Kit::ImportBuilder<Files> {
  public:
    Files() : ImportBuilder({.uid = Gauge::uid, .name = L"files"}, {L"txt"}) {}

    using QrImportBuilder::canImport;
    using QrImportBuilder::import;

    bool canImport(QrPtr<QrBufferedIO>, const wchar_t*, const wchar_t*) const override {
        return true;
    }
    QrRef<QrCastable> import(QrPtr<QrBufferedIO>, const wchar_t*, const wchar_t*) const override {
        return (new Both)->getCastable();
    }
};

class Importer final
    : public QrCastRef<QrCastHeap<
          QrCastImpl2<Importer, QrBaseImporter, Kit::BaseInterface<Importer, QrImporter>>>> {
  public:
    using Self = Importer;
    static constexpr QrUid uid{0x5C0A77E2, 0x2F1B11EF, 0x9D3A6C20, 0x81F0B365};
    const wchar_t* getBuilderName() const override { return L"files"; }
};

class Lister final : public QrEnumerator<QrCPtr<QrBuilderDescription>> {
  public:
    Action process(QrCPtr<QrBuilderDescription> builder) override {
        return builder->getFlag() ? Stop : Continue;
    }
};

} // namespace

MZ_COMPONENT(L"Strict", L"", Kit::builderOf<Both>({.uid = Gauge::uid}), Kit::builder<Files>(),
             Kit::builderOf<Importer>({.uid = Importer::uid}))

int main() {
    Static gauge;
    Private own;
    const QrPtr<Owner> owner(new Owner);
    Lister lister;
    QrGetComponentManager()->initialize(Kit::wideText("nowhere").c_str());
    return queryCast<Gauge>(&gauge)->value() + queryCast<Gauge>(&own)->value() +
           queryCast<Gauge>(owner.get())->value() +
           Mz::QrGetComponentManager()->enumerateBuilders(lister);
}
