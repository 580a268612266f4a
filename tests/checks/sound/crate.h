// SPDX-License-Identifier: BSL-1.0
/// A class of stored objects that two libraries make, of which one has the builder.
#pragma once

#include "tests/checks/sound/thing.h"

namespace Mz::Test {

class Crate final : public StoredThing<Crate, 25> {
  public:
    void write(QrStream& stream) override { stream << weight; }
    void read(QrStream& stream) override { stream >> weight; }

  private:
    int weight = 80;
};

} // namespace Mz::Test
