// SPDX-License-Identifier: BSL-1.0
/// Each object brings along a translator, which supplies an interface that the object lacks.
#include "tests/checks/sound/thing.h"

#include "components/componentManager/translation.h"

using namespace Mz;
using namespace Mz::Test;

namespace {

class Volume : public QrCastable {
  public:
    using Self = Volume;
    static constexpr QrUid uid = soundUid(0x201);
    virtual int decibels() const = 0;
};

class Loud final : public QrCastImpl<Loud, Volume> {
    int decibels() const override { return 90; }
};

/// Not with `Kit::Translation`, whose reference to the object would keep it alive for ever.
class Speaker final : public Kit::Object<Speaker, Thing> {
  public:
    Speaker() {
        QrAddTranslation(getCastable(), &loud,
                         [](const QrUid& wanted) { return wanted == Volume::uid; });
    }
    ~Speaker() override { QrRemoveTranslation(getCastable(), &loud); }
    int value() const override { return 2; }

  private:
    Loud loud;
};

} // namespace

MZ_COMPONENT(L"Translator", L"Supplies an interface for its objects",
             Kit::builderOf<Speaker>({.uid = soundUid(2), .name = L"speaker"}))
