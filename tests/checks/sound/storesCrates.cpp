// SPDX-License-Identifier: BSL-1.0
/// Makes and contains stored objects whose class has its builder in another library.
#include "tests/checks/sound/crate.h"

using namespace Mz;
using namespace Mz::Test;

namespace {

class Shelf final : public StoredThing<Shelf, 26> {
  public:
    void write(QrStream& stream) override { stream << crate.get(); }
    void read(QrStream& stream) override {
        crate = queryCast<Thing>(stream.readObject(&Thing::uid, nullptr, nullptr).get());
    }

  private:
    QrPtr<Thing> crate{new Crate};
};

} // namespace

MZ_COMPONENT(L"Shelves", L"Contains crates",
             Kit::builderOf<Shelf>({.uid = Shelf::classUid, .name = L"shelf"}),
             Kit::builderOf<Crate>({.uid = soundUid(27), .name = L"crate on a shelf"}))
