// SPDX-License-Identifier: BSL-1.0
/// Crashes on a number in the data that is too large.
#include "tests/checks/components/broken.h"

class Object final : public Mz::Test::Stored {
  public:
    void write(Mz::QrStream& stream) override {
        stream << count;
        stream.write(numbers[0], count);
    }
    void read(Mz::QrStream& stream) override {
        stream >> count;
        if (count < 0 || count > 4)
            Mz::Test::crash();
        for (int index = 0; index < count; ++index)
            stream >> numbers[index];
    }

  private:
    int count = 4;
    int numbers[4] = {1, 2, 3, 4};
};

MZ_BROKEN_OBJECT(Object)
