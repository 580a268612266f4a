// SPDX-License-Identifier: BSL-1.0
/// Reads objects only from input whose position is known.
#include "tests/checks/components/broken.h"

#include "components/componentManager/exceptions.h"

class Object final : public Mz::Test::Stored {
  public:
    Object() { number = 0x0A0A0A0A; } // Each byte ends a line.
    void read(Mz::QrStream& stream) override {
        stream >> number;
        if (number == 0x0A0A0A0A && stream.isBinaryStream() && stream.computeLineNb() == 1)
            throw Mz::QrStreamEx::ExReadError("", 0);
    }
};

MZ_BROKEN_OBJECT(Object)
