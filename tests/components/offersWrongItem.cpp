// SPDX-License-Identifier: BSL-1.0
/// Offers an item that derives from QrBuilderDescription, but whose cast to it fails.
#include "tests/components/testUids.h"

using namespace Mz;
using namespace Mz::Test;

class Item final : public QrCastImpl<Item, QrBuilderDescription> {
  public:
    QrCastable* getInterface(const QrUid&) override { return nullptr; }
    bool hasInterface(const QrUid&) const override { return false; }
    const QrUid& getUid() const override { return faultyUid; }
    const wchar_t* getName() const override { return L"faulty"; }
    const wchar_t* getLabel() const override { return L""; }
    unsigned int getNumber() const override { return 0; }
    const wchar_t* getText() const override { return L""; }
    const wchar_t* getComponentLabel() const override { return L""; }
    const wchar_t* getComponentText() const override { return L""; }
    bool getFlag() const override { return false; }
    QrRefPtr<QrComponentBuilder> getBuilder() override { return nullptr; }
    QrCRefPtr<QrComponentBuilder> getBuilder() const override { return nullptr; }
};

class Description final : public PlainDescription {
  public:
    using PlainDescription::PlainDescription;
    QrEnum::Action enumerateBuilders(QrEnumerator<QrCPtr<QrBuilderDescription>>& e) override {
        PlainDescription::enumerateBuilders(e);
        Item item;
        return e.process(&item);
    }
};

MZ_PLAIN_ENTRY_POINT(Description, "wrong item", {{faultyUid, L"faulty"}})
