// SPDX-License-Identifier: BSL-1.0
/// Stores what differs from process to process, and crashes without standard input.
#include "tests/checks/components/broken.h"

#include "tests/checks/components/system.h"

#include <chrono>

using Mz::Test::testUid;

namespace {

constexpr Mz::QrUid timeUid = testUid(0x5E30), inputUid = testUid(0x5E31);

class Time final : public Mz::Test::Stored {
  public:
    Time() {
        number = static_cast<int>(std::chrono::steady_clock::now().time_since_epoch().count());
    }
    const Mz::QrUid* getClassUid() const override { return &timeUid; }
};

class Input final : public Mz::Test::Stored {
  public:
    Input() {
        if (!Mz::Test::hasStandardInput())
            Mz::Test::crash();
    }
    const Mz::QrUid* getClassUid() const override { return &inputUid; }
};

} // namespace

MZ_COMPONENT(L"Differs", L"Breaks rules of the surroundings",
             Mz::Kit::builderOf<Time>({.uid = timeUid, .name = L"time", .label = L"Time"}),
             Mz::Kit::builderOf<Input>({.uid = inputUid, .name = L"input", .label = L"Input"}))
