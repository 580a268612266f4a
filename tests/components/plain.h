// SPDX-License-Identifier: BSL-1.0
/// Base classes for component libraries that are written without the kit. A library with a fault
/// overrides one function of them.
#pragma once

#include "components/componentManager/componentImp.h"
#include "tests/support/journal.h"

#include <utility>
#include <vector>

namespace Mz::Test {

/// The data of a builder description.
struct PlainInfo {
    QrUid uid{};
    const wchar_t* name = L"";
    const wchar_t* label = L"";
    const wchar_t* text = L"";
    unsigned int number = 0;
    bool flag = false;
};

/// Returns a uid of the family that the test components use.
constexpr QrUid testUid(std::uint32_t number) {
    return {number, 0x3C5A11EF, 0x8D1B2C00, 0x6F40A9D7};
}

/// The interface of the objects of test components: returns the name of their maker.
class PlainObject : public QrCastable {
  public:
    using Self = PlainObject;
    static constexpr QrUid uid = testUid(0xFFFFFFFF);

    virtual const char* maker() const = 0;
};

class NamedObject final : public QrCastRef<QrCastHeap<QrCastImpl<NamedObject, PlainObject>>> {
  public:
    explicit NamedObject(const char* name) : name(name) { note("objectMade"); }
    ~NamedObject() override { note("objectGone"); }
    const char* maker() const override { return name; }

  private:
    const char* name;
};

/// A builder of such objects.
class PlainBuilder final
    : public QrCastRef<QrCastHeap<QrCastImpl<PlainBuilder, QrComponentBuilder>>> {
  public:
    explicit PlainBuilder(const char* maker) : maker(maker) { note("builderMade"); }
    ~PlainBuilder() override { note("builderGone"); }

    QrRef<QrCastable> createObject() override {
        const QrPtr<NamedObject> object(new NamedObject(maker));
        return object;
    }

  private:
    const char* maker;
};

/// The description of one builder; it is not the builder itself.
class PlainBuilderDescription final
    : public QrCastRef<QrCastHeap<QrCastImpl<PlainBuilderDescription, QrBuilderDescription>>> {
  public:
    explicit PlainBuilderDescription(const PlainInfo& info) : info(info) { note("itemMade"); }
    ~PlainBuilderDescription() override { note("itemGone"); }

    const QrUid& getUid() const override { return info.uid; }
    const wchar_t* getName() const override { return info.name; }
    const wchar_t* getLabel() const override { return info.label; }
    unsigned int getNumber() const override { return info.number; }
    const wchar_t* getText() const override { return info.text; }
    bool getFlag() const override { return info.flag; }

    // The manager does not need these of an item.
    const wchar_t* getComponentLabel() const override { return surprise(); }
    const wchar_t* getComponentText() const override { return surprise(); }
    QrRefPtr<QrComponentBuilder> getBuilder() override { return surprise(), nullptr; }
    QrCRefPtr<QrComponentBuilder> getBuilder() const override { return surprise(), nullptr; }

  private:
    static const wchar_t* surprise() {
        note("itemAskedForMore");
        return L"?";
    }

    PlainInfo info;
};

/// The description of a library with any number of builders.
template <class Base = QrCastImpl<QrComponentDescription, QrComponentDescription>>
class PlainDescriptionOver : public Base {
  public:
    PlainDescriptionOver(const char* maker, std::vector<PlainInfo> builders)
        : maker(maker), builders(std::move(builders)) {}

    QrRef<QrCastable> createBuilder(const QrUid& uid) override {
        for (const PlainInfo& info : builders)
            if (info.uid == uid)
                return QrPtr<PlainBuilder>(new PlainBuilder(maker));
        return nullptr;
    }

    int64 getComponentValue() override { return 0x123456789ABCDEF; }
    const wchar_t* getComponentLabel() override { return L"Plain label"; }
    const wchar_t* getComponentText() override { return L"Plain text"; }
    unsigned int getBuilderCount() override { return static_cast<unsigned int>(builders.size()); }

    QrEnum::Action enumerateBuilders(QrEnumerator<QrCPtr<QrBuilderDescription>>& e) override {
        note("enumerate");
        for (const PlainInfo& info : builders)
            if (const QrEnum::Action action =
                    e.process(QrPtr<PlainBuilderDescription>(new PlainBuilderDescription(info))))
                return action;
        return e.finished();
    }

  protected:
    const char* maker;
    std::vector<PlainInfo> builders;
};

/// A description that does not count, for static objects.
using PlainDescription = PlainDescriptionOver<>;

} // namespace Mz::Test

/// Defines an entry point that always returns one static `Description`, constructed from the
/// arguments.
#define MZ_PLAIN_ENTRY_POINT(Description, ...)                                                     \
    extern "C" MZ_EXPORT Mz::QrCastable* QrGetComponentDescription() {                             \
        Mz::Test::note("entry");                                                                   \
        static Description description{__VA_ARGS__};                                               \
        return &description;                                                                       \
    }
