// SPDX-License-Identifier: BSL-1.0
/// Reads objects whose data is cut off.
#include "tests/checks/components/broken.h"

class Object final : public Mz::Test::Stored {
  public:
    void write(Mz::QrStream& stream) override { stream.write(numbers[0], 4); }
    void read(Mz::QrStream& stream) override { stream.read(numbers[0], 4); }

  private:
    int numbers[4] = {1, 2, 3, 4};
};

MZ_BROKEN_OBJECT(Object)
