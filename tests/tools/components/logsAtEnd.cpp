// SPDX-License-Identifier: BSL-1.0
/// An importer whose library logs a message when it is unloaded.
#include "components/componentKit/componentKit.h"
#include "components/componentManager/processControl.h"
#include "tests/components/testUids.h"

using namespace Mz;

namespace {

struct Farewell {
    ~Farewell() {
        const auto controller =
            QrPtr<QrProcessControl>::adopt(safeCast<QrProcessControl>(QrGetProcessController()));
        controller->log(0, L"the library is unloaded");
    }
} farewell;

class LastImporter final : public Kit::ImportBuilder<LastImporter> {
  public:
    LastImporter()
        : ImportBuilder({.uid = Test::testUid(0x30020), .name = L"last", .label = L"Last"},
                        {L"last"}) {}

    using QrImportBuilder::canImport;
    using QrImportBuilder::import;

    bool canImport(QrPtr<QrBufferedIO>, const wchar_t*, const wchar_t*) const override {
        return false;
    }
    QrRef<QrCastable> import(QrPtr<QrBufferedIO>, const wchar_t*, const wchar_t*) const override {
        return nullptr;
    }
};

} // namespace

MZ_COMPONENT(L"Last words", L"Logs when it is unloaded", Kit::builder<LastImporter>())
