// SPDX-License-Identifier: BSL-1.0
/// Returns a new description with a reference at each call.
#include "tests/checks/components/broken.h"

using namespace Mz;

class Counted final : public Test::PlainDescriptionOver<
                          QrCastRef<QrCastHeap<QrCastImpl<Counted, QrComponentDescription>>>> {
  public:
    using PlainDescriptionOver::PlainDescriptionOver;
};

extern "C" MZ_EXPORT QrCastable* QrGetComponentDescription() {
    const std::vector<Test::PlainInfo> builders{{Test::brokenUid, L"broken", L"Broken", L"", 0}};
    return QrPtr<Counted>(new Counted("broken", builders)).detach();
}
