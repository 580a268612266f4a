// SPDX-License-Identifier: BSL-1.0
/// Only translators answer the casts of its description, its item and its builder.
#include "tests/components/testUids.h"

using namespace Mz;
using namespace Mz::Test;

namespace {

bool all(const QrUid&) {
    return true;
}

/// Answers no cast.
template <class Iface>
class Mute : public QrCastImpl<Mute<Iface>, Iface> {
  public:
    QrCastable* getInterface(const QrUid&) override { return nullptr; }
    bool hasInterface(const QrUid&) const override { return false; }
};

class MuteObject final : public QrCastRef<QrCastHeap<Mute<PlainObject>>> {
  public:
    explicit MuteObject(QrCastable* answers) : translator(answers) {
        QrAddTranslation(this, answers, all);
    }
    ~MuteObject() override { QrRemoveTranslation(this, translator.get()); }
    const char* maker() const override { return "mute"; }

  private:
    QrPtr<QrCastable> translator;
};

class MuteItem final : public QrCastImpl<MuteItem, QrBuilderDescription> {
  public:
    explicit MuteItem(QrCastable* translator) : translator(translator) {
        QrAddTranslation(this, translator, all);
    }
    ~MuteItem() override { QrRemoveTranslation(this, translator); }
    QrCastable* getInterface(const QrUid&) override { return nullptr; }
    bool hasInterface(const QrUid&) const override { return false; }
    const QrUid& getUid() const override { return faultyUid; }
    const wchar_t* getName() const override { return L"not this"; }
    const wchar_t* getLabel() const override { return L""; }
    unsigned int getNumber() const override { return 0; }
    const wchar_t* getText() const override { return L""; }
    const wchar_t* getComponentLabel() const override { return L""; }
    const wchar_t* getComponentText() const override { return L""; }
    bool getFlag() const override { return false; }
    QrRefPtr<QrComponentBuilder> getBuilder() override { return nullptr; }
    QrCRefPtr<QrComponentBuilder> getBuilder() const override { return nullptr; }

  private:
    QrCastable* translator;
};

class Description final : public PlainDescription {
  public:
    using PlainDescription::PlainDescription;
    QrRef<QrCastable> createBuilder(const QrUid&) override {
        return QrPtr<MuteObject>(new MuteObject(new PlainBuilder("translated")));
    }
    QrEnum::Action enumerateBuilders(QrEnumerator<QrCPtr<QrBuilderDescription>>& e) override {
        const QrPtr<PlainBuilderDescription> real(new PlainBuilderDescription(builders.front()));
        MuteItem item(real.get());
        return e.process(&item);
    }
};

} // namespace

extern "C" MZ_EXPORT QrCastable* QrGetComponentDescription() {
    static Description description("translated", {{translatedUid, L"translated"}});
    return new MuteObject(&description);
}
