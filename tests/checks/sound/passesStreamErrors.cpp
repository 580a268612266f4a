// SPDX-License-Identifier: BSL-1.0
/// Lets the exceptions of a stream leave its import, and ends it by the controller's abort.
#include "tests/checks/sound/thing.h"

#include "components/componentManager/bufferio.h"
#include "components/componentManager/processControl.h"
#include "components/componentManager/textStream.h"

using namespace Mz;
using namespace Mz::Test;

namespace {

class Number final : public Kit::Object<Number, Thing> {
  public:
    explicit Number(int number) : number(number) {}
    int value() const override { return number; }

  private:
    int number;
};

class NumberImporter final : public Kit::ImportBuilder<NumberImporter> {
  public:
    static constexpr QrUid builderUid = soundUid(4);

    NumberImporter()
        : ImportBuilder({.uid = builderUid, .name = L"number", .label = L"Numbers"}, {L"num"}) {}

    using ImportBuilder::canImport;
    using ImportBuilder::import;

    bool canImport(QrPtr<QrBufferedIO>, const wchar_t*, const wchar_t*) const override {
        return true;
    }

    QrRef<QrCastable> import(QrPtr<QrBufferedIO> io, const wchar_t*,
                             const wchar_t*) const override {
        QrTextStream stream(io.get());
        int number = 0;
        stream >> number;
        if (number < 0)
            QrGetProcessController()->abort(2, L"the number is negative");
        return new Number(number);
    }
};

} // namespace

MZ_COMPONENT(L"Numbers", L"Imports one number", Kit::builder<NumberImporter>())
