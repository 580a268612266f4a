// SPDX-License-Identifier: BSL-1.0
/// Makes no object outside its host, which the builder recognises by an object of the host.
#include "tests/checks/sound/thing.h"

#include "components/componentManager/processControl.h"

using namespace Mz;
using namespace Mz::Test;

namespace {

class Window final : public Kit::Object<Window, Thing> {
  public:
    explicit Window(void* handle) : handle(handle) {}
    int value() const override { return handle ? 1 : 0; }

  private:
    void* handle;
};

class WindowBuilder final : public Kit::Builder<WindowBuilder> {
  public:
    static constexpr QrUid builderUid = soundUid(24);

    WindowBuilder() : Builder({.uid = builderUid, .name = L"window"}) {}
    QrRef<QrCastable> createObject() override {
        QrProcessControl* const controller = QrGetProcessController();
        void* const handle = controller ? controller->getContext() : nullptr;
        return handle ? (new Window(handle))->getCastable() : nullptr;
    }
};

} // namespace

MZ_COMPONENT(L"Window", L"Needs the window of a host", Kit::builder<WindowBuilder>())
