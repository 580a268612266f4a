// SPDX-License-Identifier: BSL-1.0
/// Stores objects whose `write` fails.
#include "tests/checks/components/broken.h"

#include "components/componentManager/exceptions.h"

class Object final : public Mz::Test::Stored {
  public:
    void write(Mz::QrStream& stream) override {
        stream << number;
        throw Mz::QrStreamEx::ExWriteError("cannotBeWritten", __LINE__, "there is no room");
    }
};

MZ_BROKEN_OBJECT(Object)
