// SPDX-License-Identifier: BSL-1.0
/// Reads objects without a part of their state.
#include "tests/checks/components/broken.h"

class Object final : public Mz::Test::Stored {
  public:
    Object() { number = ++made; }
    void write(Mz::QrStream& stream) override { stream << number << 1; }
    void read(Mz::QrStream& stream) override {
        int ignored = 0;
        stream >> ignored >> ignored;
        number = -1;
    }

  private:
    static inline int made = 0;
};

class Builder final : public Mz::Test::Building<Builder> {
  public:
    Mz::QrRef<Mz::QrCastable> createObject() override {
        auto* const object = new Object;
        return object->getCastable();
    }
};

MZ_BROKEN_BUILDER(Builder)
