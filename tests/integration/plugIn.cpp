// SPDX-License-Identifier: BSL-1.0
/// A plug-in for loadingHost. A static object uses the component manager's registries and streams
/// when the plug-in is loaded, and checks its entries when the plug-in is unloaded.
#include "components/componentManager/processControl.h"
#include "components/componentManager/textStream.h"
#include "tests/components/plain.h"

#include <sstream>

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

/// A buffer class from outside the library: the library cannot take its short cut for it.
class ForeignBuffer final : public QrOutBuffer {
  public:
    using QrOutBuffer::QrOutBuffer;
};

template <class Buffer>
void writeNumber() {
    std::ostringstream bytes;
    Buffer buffer(&bytes);
    QrTextStream stream(&buffer);
    stream.formattedWrite(L"%d%s", 1, L"text");
}

struct FirstAndLast {
    FirstAndLast() {
        writeNumber<QrOutBuffer>();
        writeNumber<ForeignBuffer>();
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
