// SPDX-License-Identifier: BSL-1.0
/// Calls the manager from its entry point and from its enumeration.
#include "tests/components/testUids.h"

using namespace Mz;
using namespace Mz::Test;

namespace {

class Counter final : public QrEnumerator<QrCPtr<QrBuilderDescription>> {
  public:
    Action process(QrCPtr<QrBuilderDescription>) override {
        note("sawBuilder");
        return Continue;
    }
    Action finished() override {
        note("walked");
        return Continue;
    }
};

void useManager() {
    QrComponentManager* manager = managerUnderTest();
    if (!manager)
        return;
    manager->initialize(searchPathUnderTest());
    if (manager->createObject(goodUid))
        note("gotObject");
    if (manager->getBuilder(goodUid))
        note("gotBuilder");
    Counter counter;
    manager->enumerateBuilders(counter);
}

class Description final : public PlainDescription {
  public:
    using PlainDescription::PlainDescription;
    QrEnum::Action enumerateBuilders(QrEnumerator<QrCPtr<QrBuilderDescription>>& e) override {
        useManager();
        const QrEnum::Action action = PlainDescription::enumerateBuilders(e);
        useManager();
        return action;
    }
};

} // namespace

extern "C" MZ_EXPORT QrCastable* QrGetComponentDescription() {
    static Description description("reentrant", {{reentrantUid, L"reentrant"}});
    useManager();
    return &description;
}
