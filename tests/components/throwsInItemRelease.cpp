// SPDX-License-Identifier: BSL-1.0
/// Offers an item that throws in its first `release`.
#include "tests/components/testUids.h"

#include <stdexcept>

using namespace Mz;
using namespace Mz::Test;

class Item final : public QrCastImpl<Item, QrBuilderDescription> {
  public:
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
    long release() override {
        if (!thrown) {
            thrown = true;
            throw std::runtime_error("in an item's release");
        }
        return 1;
    }

  private:
    bool thrown = false;
};

class Description final : public PlainDescription {
  public:
    using PlainDescription::PlainDescription;
    QrEnum::Action enumerateBuilders(QrEnumerator<QrCPtr<QrBuilderDescription>>& e) override {
        Item item;
        return e.process(&item);
    }
};

MZ_PLAIN_ENTRY_POINT(Description, "item release", {})
