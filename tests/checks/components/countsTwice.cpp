// SPDX-License-Identifier: BSL-1.0
/// Makes objects whose getInterface takes two references.
#include "tests/checks/components/broken.h"

class Object final : public Mz::Test::Stored {
  public:
    Mz::QrCastable* getInterface(const Mz::QrUid& wanted) override {
        Mz::QrCastable* const view = Stored::getInterface(wanted);
        if (view)
            newReference();
        return view;
    }
};

class Builder final : public Mz::Test::Building<Builder> {
  public:
    Mz::QrRef<Mz::QrCastable> createObject() override {
        static Object* const only = new Object;
        static const Mz::QrPtr<Object> kept(only);
        return only->getCastable();
    }
};

MZ_BROKEN_BUILDER(Builder)
