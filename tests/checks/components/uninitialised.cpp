// SPDX-License-Identifier: BSL-1.0
/// Stores a number that nothing initialised.
#include "tests/checks/components/broken.h"

class Object final : public Mz::Test::Stored {
  public:
    Object() : values(new unsigned int[50]) {}
    ~Object() override { delete[] values; }
    // Not the first ones, which the heap itself may use.
    void write(Mz::QrStream& stream) override { stream << values[40]; }
    void read(Mz::QrStream& stream) override { stream >> values[40]; }

  private:
    unsigned int* values;
};

MZ_BROKEN_OBJECT(Object)
