// SPDX-License-Identifier: BSL-1.0
/// Stores objects under a class uid that no builder has.
#include "tests/checks/components/broken.h"

class Object final : public Mz::Test::Stored {
  public:
    const Mz::QrUid* getClassUid() const override {
        static constexpr Mz::QrUid unknown = Mz::Test::testUid(0x5E2);
        return &unknown;
    }
};

MZ_BROKEN_OBJECT(Object)
