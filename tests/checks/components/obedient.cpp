// SPDX-License-Identifier: BSL-1.0
/// Answers with the functions of the test that loads it, so that a rule can be checked in the
/// process of the test. It exports more names than a finding lists.
#include "tests/checks/obeying.h"

using namespace Mz;
using namespace Mz::Test;

static Orders orders;

extern "C" MZ_EXPORT void mzTestObey(const Orders* given) {
    orders = *given;
}

extern "C" MZ_EXPORT QrCastable* QrGetComponentDescription() {
    return orders.describe();
}

extern "C" MZ_EXPORT bool MzRunComponentTest(int number, Kit::TestReport& report) {
    return orders.runTest(number, report);
}

extern "C" MZ_EXPORT int mzTestFirst() {
    return 1;
}
extern "C" MZ_EXPORT int mzTestSecond() {
    return 2;
}
extern "C" MZ_EXPORT int mzTestThird() {
    return 3;
}
extern "C" MZ_EXPORT int mzTestFourth() {
    return 4;
}
extern "C" MZ_EXPORT int mzTestFifth() {
    return 5;
}
