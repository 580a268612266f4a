// SPDX-License-Identifier: BSL-1.0
/// Writes the number of its form first, reads an older form too, and throws at a newer one.
#include "tests/checks/sound/thing.h"

#include "components/componentManager/exceptions.h"

using namespace Mz;
using namespace Mz::Test;

namespace {

class Settings final : public StoredThing<Settings, 17> {
  public:
    unsigned int getVersion() const override { return 2; }
    void write(QrStream& stream) override { stream << getVersion() << width << height; }
    void read(QrStream& stream) override {
        unsigned int form = 0;
        stream >> form >> width;
        if (form == 0 || form > getVersion())
            throw QrStreamEx::ExReadError("newerVersion", __LINE__, "the form is unknown");
        height = width; // The first form had squares only.
        if (form > 1)
            stream >> height;
    }

  private:
    double width = 0.1, height = 1e-9;
};

} // namespace

MZ_COMPONENT(L"Settings", L"Stores two versions",
             Kit::builderOf<Settings>({.uid = Settings::classUid, .name = L"settings"}))
