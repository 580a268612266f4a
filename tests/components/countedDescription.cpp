// SPDX-License-Identifier: BSL-1.0
/// Returns a new counted description from each call, with no reference taken.
#include "tests/components/testUids.h"

using namespace Mz;
using namespace Mz::Test;

class Counted final : public PlainDescriptionOver<
                          QrCastRef<QrCastHeap<QrCastImpl<Counted, QrComponentDescription>>>> {
  public:
    Counted() : PlainDescriptionOver("counted", {{countedUid, L"counted"}}) {
        note("descriptionMade");
    }
    ~Counted() override { note("descriptionGone"); }
};

extern "C" MZ_EXPORT QrCastable* QrGetComponentDescription() {
    return new Counted;
}
