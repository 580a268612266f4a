// SPDX-License-Identifier: BSL-1.0
// Is slow when the description of its builder returns the label.
#include "tests/tools/components/sleeps.h"

namespace {

using Mz::Test::PlainDescription;

using namespace Mz;

class SlowItem final : public QrCastRef<QrCastHeap<QrCastImpl<SlowItem, QrBuilderDescription>>> {
  public:
    const QrUid& getUid() const override {
        static constexpr QrUid uid = Test::testUid(0x41003);
        return uid;
    }
    const wchar_t* getName() const override { return L"sleeps"; }
    const wchar_t* getLabel() const override {
        Test::sleepLong();
        return L"slow";
    }
    unsigned int getNumber() const override { return 0; }
    const wchar_t* getText() const override { return L""; }
    bool getFlag() const override { return false; }
    const wchar_t* getComponentLabel() const override { return L""; }
    const wchar_t* getComponentText() const override { return L""; }
    QrRefPtr<QrComponentBuilder> getBuilder() override { return nullptr; }
    QrCRefPtr<QrComponentBuilder> getBuilder() const override { return nullptr; }
};

class Description final : public PlainDescription {
  public:
    using PlainDescription::PlainDescription;
    QrEnum::Action enumerateBuilders(QrEnumerator<QrCPtr<QrBuilderDescription>>& e) override {
        if (const QrEnum::Action action = e.process(QrPtr<SlowItem>(new SlowItem)))
            return action;
        return e.finished();
    }
};

} // namespace

MZ_PLAIN_ENTRY_POINT(Description, "sleeps", {})
