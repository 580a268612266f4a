// SPDX-License-Identifier: BSL-1.0
/// Fails when an object is made, which a scan does not do. MZ_TEST_FAILURE selects how, and
/// MZ_TEST_NUMBER the uid.
#include "components/componentKit/componentKit.h"
#include "tests/components/testUids.h"
#include "tests/support/journal.h"
#include "tests/tools/components/faults.h"

#include <chrono>
#include <cstdlib>
#include <thread>

using namespace Mz;

namespace {

/// Crashes.
[[maybe_unused]] void crashes() {
    Test::crash();
}

/// Ends the process when the other of two such components is there, too.
[[maybe_unused]] void failsWith(const char* own, const char* other) {
    Test::note(own);
    if (Test::noted(other))
        std::_Exit(7);
}

/// Ends the process in three of ten starts.
[[maybe_unused]] void failsSometimes() {
    const char* const start = std::getenv("MZ_TEST_START");
    if (start && std::atoi(start) * 7 % 10 < 3)
        std::_Exit(7);
}

[[maybe_unused]] void hangs() {
    std::this_thread::sleep_for(std::chrono::hours(1));
}

class Failing final : public QrCastRef<QrCastHeap<QrCastImpl<Failing, Test::PlainObject>>> {
  public:
    Failing() { MZ_TEST_FAILURE; }
    const char* maker() const override { return "failing"; }
};

} // namespace

MZ_COMPONENT(L"Failing", L"Fails when it is used",
             Kit::builderOf<Failing>({.uid = Test::testUid(0x30020 + MZ_TEST_NUMBER),
                                      .name = L"failing"}))
