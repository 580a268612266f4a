// SPDX-License-Identifier: BSL-1.0
/// Refuses each file with another function of the process controller, and heeds all its answers.
#include "tests/checks/sound/thing.h"

#include "components/componentManager/processControl.h"

#include <stdexcept>

using namespace Mz;
using namespace Mz::Test;

namespace {

class Refusing final : public Kit::ImportBuilder<Refusing> {
  public:
    Refusing()
        : ImportBuilder({.uid = soundUid(40), .name = L"refusing", .label = L"Refused files"},
                        {L"refused"}) {}
    using ImportBuilder::canImport;
    using ImportBuilder::import;

    bool canImport(QrPtr<QrBufferedIO> io, const wchar_t*, const wchar_t*) const override {
        first = io->read();
        return true;
    }

    QrRef<QrCastable> import(QrPtr<QrBufferedIO>, const wchar_t*, const wchar_t*) const override {
        QrProcessControl& controller = *QrGetProcessController();
        expect(!controller.getContext());
        // A check shows everything, so that everything is reported.
        expect(controller.isProgressShown() && controller.isStatusShown() &&
               controller.isErrorShown());
        expect(controller.findFile(L"style.of.the.host", L"styles", nullptr).empty());
        controller.status(L"Reading");
        switch (first & 3) {
        case 0: controller.message(1, L"This file cannot be read"); break;
        case 1: controller.warning(2, L"This file cannot be read"); break;
        case 2: expect(!controller.error(3, L"This file cannot be read")); break;
        default: controller.log(4, L"This file cannot be read"); break;
        }
        return nullptr;
    }

  private:
    /// Throws what hosts do not expect, which is a finding.
    static void expect(bool condition) {
        if (!condition)
            throw std::logic_error("an unexpected answer");
    }

    mutable int first = 0; ///< the first byte of the file that was accepted last
};

} // namespace

MZ_COMPONENT(L"Refusing", L"Reports in each way", Kit::builder<Refusing>())
