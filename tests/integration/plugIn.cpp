/// A plug-in of a host: a library that uses the component manager, and its registries before and
/// after everything else.
#include "components/componentManager/processControl.h"
#include "tests/components/plain.h"

using namespace Mz;
using namespace Mz::Test;

extern "C" MZ_EXPORT QrComponentManager* managerOfPlugIn();

QrComponentManager* managerOfPlugIn() {
    return QrGetComponentManager();
}

namespace {

alignas(QrProcessControl) char noController[sizeof(QrProcessControl)];

class Asked final : public QrCastImpl<Asked, QrComponentBuilder> {
    QrRef<QrCastable> createObject() override { return nullptr; }
};

class Translator final : public QrCastImpl<Translator, PlainObject> {
    const char* maker() const override { return "translator"; }
};

struct FirstAndLast {
    FirstAndLast() {
        QrAddTranslation(&asked, &translator, [](const QrUid&) { return true; });
        QrSetThreadProcessController(controller());
        note(answered() ? "first" : "wrong");
    }
    ~FirstAndLast() { note(answered() ? "last" : "wrong"); }

    static QrProcessControl* controller() {
        return reinterpret_cast<QrProcessControl*>(noController);
    }
    bool answered() {
        return QrTranslateInterface(&asked, PlainObject::uid) == &translator &&
               QrGetProcessController() == controller();
    }

    Asked asked;
    Translator translator;
} firstAndLast;

} // namespace
