// SPDX-License-Identifier: BSL-1.0
/// Leaks memory when the data is cut off.
#include "tests/checks/components/broken.h"

class Object final : public Mz::Test::Stored {
  public:
    void read(Mz::QrStream& stream) override {
        auto* const read = new int[100]; // Freed only if nothing throws.
        stream >> read[0];
        number = read[0];
        delete[] read;
    }
};

MZ_BROKEN_OBJECT(Object)
