// SPDX-License-Identifier: BSL-1.0
/// Looks for a file of the host by the process controller, and has a default where there is none.
#include "tests/checks/sound/thing.h"

#include "components/componentManager/processControl.h"

using namespace Mz;
using namespace Mz::Test;

namespace {

class Style final : public Kit::Object<Style, Thing> {
  public:
    Style() {
        if (QrProcessControl* const controller = QrGetProcessController())
            file = controller->findFile(L"style.of.the.host", L"styles;themes", nullptr);
    }
    int value() const override { return file.empty() ? 0 : 1; }

  private:
    std::wstring file;
};

} // namespace

MZ_COMPONENT(L"Style", L"Finds a file by the controller",
             Kit::builderOf<Style>({.uid = soundUid(23), .name = L"style"}))
