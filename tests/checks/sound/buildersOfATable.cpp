// SPDX-License-Identifier: BSL-1.0
/// Without the kit: enumerates builders that it makes from a table, and is stamped by hand.
#include "tests/checks/sound/thing.h"

#include <deque>

using namespace Mz;
using namespace Mz::Test;

namespace {

class Entry final : public Kit::Object<Entry, Thing> {
  public:
    explicit Entry(int number) : number(number) {}
    int value() const override { return number; }

  private:
    int number;
};

class EntryBuilder final
    : public QrCastMulti<EntryBuilder, QrComponentBuilder, QrBuilderDescription> {
  public:
    EntryBuilder(int number, const wchar_t* label)
        : number(number), label(label), identity(soundUid(0x1100 + static_cast<unsigned>(number))) {
    }
    QrRef<QrCastable> createObject() override { return (new Entry(number))->getCastable(); }
    const QrUid& getUid() const override { return identity; }
    const wchar_t* getName() const override { return L"entry"; }
    const wchar_t* getLabel() const override { return label; }
    unsigned int getNumber() const override { return static_cast<unsigned int>(number); }
    const wchar_t* getText() const override { return L""; }
    const wchar_t* getComponentLabel() const override { return L""; }
    const wchar_t* getComponentText() const override { return L""; }
    bool getFlag() const override { return false; }
    QrRefPtr<QrComponentBuilder> getBuilder() override { return this; }
    QrCRefPtr<QrComponentBuilder> getBuilder() const override { return this; }

  private:
    int number;
    const wchar_t* label;
    QrUid identity;
};

class Description final : public QrCastImpl<Description, QrComponentDescription> {
  public:
    Description() {
        int number = 0;
        for (const wchar_t* label : {L"one", L"two", L"three", L"four"})
            builders.emplace_back(++number, label);
    }
    QrRef<QrCastable> createBuilder(const QrUid& uid) override {
        for (EntryBuilder& builder : builders)
            if (builder.getUid() == uid)
                return builder.getCastable();
        return nullptr;
    }
    int64 getComponentValue() override { return 4; }
    const wchar_t* getComponentLabel() override { return L"Entries"; }
    const wchar_t* getComponentText() override { return L"Four builders of one table"; }
    unsigned int getBuilderCount() override { return static_cast<unsigned int>(builders.size()); }
    QrEnum::Action enumerateBuilders(QrEnumerator<QrCPtr<QrBuilderDescription>>& e) override {
        for (EntryBuilder& builder : builders)
            if (const QrEnum::Action action = e.process(&builder))
                return action;
        return e.finished();
    }

  private:
    std::deque<EntryBuilder> builders;
};

} // namespace

MZ_COMPONENT_STAMP;

extern "C" MZ_EXPORT QrCastable* QrGetComponentDescription() {
    static Description description;
    return &description;
}
