// SPDX-License-Identifier: BSL-1.0
/// Persistent objects that share one inner object, and store it once.
#include "tests/checks/sound/thing.h"

#include "components/componentManager/exceptions.h"

using namespace Mz;
using namespace Mz::Test;

namespace {

class Leaf final : public StoredThing<Leaf, 8> {
  public:
    void write(QrStream& stream) override { stream << number; }
    void read(QrStream& stream) override { stream >> number; }

  private:
    int number = 12;
};

class Branch final : public StoredThing<Branch, 9> {
  public:
    void write(QrStream& stream) override { stream << left.get() << right.get() << other.get(); }
    void read(QrStream& stream) override {
        left = readThing(stream);
        right = readThing(stream);
        other = readThing(stream);
        if (!left || left != right)
            throw QrStreamEx::ExReadError("sharesObjects", __LINE__, "the leaf is not shared");
    }

  private:
    static QrPtr<Thing> readThing(QrStream& stream) {
        return queryCast<Thing>(stream.readObject(&Thing::uid, nullptr, nullptr).get());
    }

    QrPtr<Thing> left{new Leaf};
    QrPtr<Thing> right = left;
    QrPtr<Thing> other; // null
};

} // namespace

MZ_COMPONENT(L"Branches", L"Objects that share an object",
             Kit::builderOf<Leaf>({.uid = Leaf::classUid, .name = L"leaf"}),
             Kit::builderOf<Branch>({.uid = Branch::classUid, .name = L"branch"}))
