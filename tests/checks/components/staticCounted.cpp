// SPDX-License-Identifier: BSL-1.0
/// Returns a static description that counts its references.
#include "tests/checks/components/broken.h"

using namespace Mz;

class Counted final : public Test::PlainDescriptionOver<
                          QrCastRef<QrCastHeap<QrCastImpl<Counted, QrComponentDescription>>>> {
  public:
    using PlainDescriptionOver::PlainDescriptionOver;
};

MZ_BROKEN_DESCRIPTION(Counted)
