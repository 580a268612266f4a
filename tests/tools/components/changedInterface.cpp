// SPDX-License-Identifier: BSL-1.0
/// A component that works, with an interface that its host has in another form.
#define MZ_EDIT_inserted
#include "components/componentKit/componentKit.h"
#include "tests/components/testUids.h"
#include "tests/tools/interfaces/edited.h"

using namespace Mz;

namespace {

class Thing final : public Kit::Object<Thing, Edited::Other> {
    void other(QrRef<Edited::Greeter>) override {}
};

} // namespace

MZ_COMPONENT(L"Changed", L"Its interface was changed",
             Kit::builderOf<Thing>({.uid = Test::goodUid, .name = L"changed"}))
