// SPDX-License-Identifier: BSL-1.0
/// Written with the kit. The destructor of a static object calls the library's own entry point.
#include "components/componentKit/componentKit.h"
#include "tests/components/testUids.h"

using namespace Mz;
using namespace Mz::Test;

extern "C" QrCastable* QrGetComponentDescription();

namespace {

class Object final : public QrCastRef<QrCastHeap<QrCastImpl<Object, PlainObject>>> {
  public:
    const char* maker() const override { return "asks"; }
};

/// A counted builder that owns heap memory.
class CountedBuilder final : public Kit::ImportBuilder<CountedBuilder> {
  public:
    CountedBuilder()
        : ImportBuilder({.uid = asksCountedUid, .name = L"counted"}, {L"one", L"two"}) {}
    ~CountedBuilder() override { note("builderGone"); }

    bool canImport(QrPtr<QrBufferedIO>, const wchar_t*, const wchar_t*) const override {
        return false;
    }
    QrRef<QrCastable> import(QrPtr<QrBufferedIO>, const wchar_t*, const wchar_t*) const override {
        return nullptr;
    }
    QrRef<QrCastable> createObject() override { return (new Object)->getCastable(); }
};

bool makesObject(const QrUid& uid) {
    const auto description = queryCast<QrComponentDescription>(QrGetComponentDescription());
    const QrRef<QrCastable> made = description ? description->createBuilder(uid) : nullptr;
    const auto builder = queryCast<QrComponentBuilder>(made.get());
    return builder && builder->createObject();
}

struct AsksInDestructor {
    ~AsksInDestructor() {
        if (makesObject(asksUid) && makesObject(asksCountedUid))
            note("answeredInDestructor");
    }
} asksInDestructor;

} // namespace

MZ_COMPONENT(L"Asks", L"Asks itself", Kit::builderOf<Object>({.uid = asksUid, .name = L"asks"}),
             Kit::builder<CountedBuilder>())
