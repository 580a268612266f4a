// SPDX-License-Identifier: BSL-1.0
/// Holds a file open while it is loaded, and closes it when it is unloaded.
#include "tests/checks/sound/thing.h"

#include <cstdio>

using namespace Mz;
using namespace Mz::Test;

namespace {

std::FILE* log() {
    static std::FILE* const file = std::tmpfile();
    return file;
}

class Logger final : public Kit::Object<Logger, Thing> {
  public:
    Logger() { opened = log() != nullptr; }
    int value() const override { return opened ? 1 : 0; }

  private:
    bool opened = false;
};

void closeLog() {
    if (std::FILE* const file = log())
        std::fclose(file);
}

} // namespace

MZ_AT_UNLOAD(closeLog);

MZ_COMPONENT(L"Logger", L"Holds a file open",
             Kit::builderOf<Logger>({.uid = soundUid(21), .name = L"logger"}))
