// SPDX-License-Identifier: BSL-1.0
/// Persistent objects that ask to be notified when the load is over.
#include "tests/checks/sound/thing.h"

#include "components/componentManager/exceptions.h"

using namespace Mz;
using namespace Mz::Test;

namespace {

class Child final : public StoredThing<Child, 18> {
  public:
    void write(QrStream& stream) override { stream << age; }
    void read(QrStream& stream) override {
        stream >> age;
        stream.postLoad(this);
    }
    void loadFinished() override { complete = true; }

  private:
    int age = 7;
    bool complete = false;
};

class Parent final : public StoredThing<Parent, 19> {
  public:
    void write(QrStream& stream) override { stream << child.get(); }
    void read(QrStream& stream) override {
        child = queryCast<Thing>(stream.readObject(&Thing::uid, nullptr, nullptr).get());
        if (!child)
            throw QrStreamEx::ExReadError("linksAfterLoad", __LINE__, "the child is missing");
        stream.postLoad(this);
    }

  private:
    QrPtr<Thing> child{new Child};
};

} // namespace

MZ_COMPONENT(L"Parents", L"Objects that are notified after a load",
             Kit::builderOf<Child>({.uid = Child::classUid, .name = L"child"}),
             Kit::builderOf<Parent>({.uid = Parent::classUid, .name = L"parent"}))
