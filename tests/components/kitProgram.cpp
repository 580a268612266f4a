// SPDX-License-Identifier: BSL-1.0
/// A program that is built like a component, needs libraries, and exports the entry point.
#include "components/componentKit/componentKit.h"
#include "tests/components/testUids.h"

using namespace Mz;

class ProgramObject final
    : public QrCastRef<QrCastHeap<QrCastImpl<ProgramObject, Test::PlainObject>>> {
  public:
    const char* maker() const override { return "program"; }
};

MZ_COMPONENT(L"Program label", L"Program text",
             Kit::builderOf<ProgramObject>({.uid = Test::kitUid, .name = L"program"}))

int main() {
    return QrGetComponentDescription() ? 0 : 1;
}
