// SPDX-License-Identifier: BSL-1.0
/// The component: work that takes long. It has no user interface. Everything that the user should
/// know, or may decide, goes through the process controller, which the work asks for once. It
/// reports progress a hundred times, not for each number, and works without a controller too.
#include "counter.h"

#include "components/componentKit/componentKit.h"
#include "components/componentManager/processControl.h"

#include <algorithm>

using namespace Mz;

namespace {

bool isPrime(int number) {
    for (int divisor = 2; divisor <= number / divisor; ++divisor)
        if (number % divisor == 0)
            return false;
    return number > 1;
}

class PrimeCounter final : public Kit::Object<PrimeCounter, Counter> {
  public:
    int primesBelow(int limit) override {
        QrProcessControl* const controller = QrGetProcessController();
        if (limit < 0 && controller)
            controller->abort(0, L"the limit is negative");
        if (limit < 2 && controller && !controller->warning(0, L"no number below 2 is prime"))
            return -1;

        const int step = std::max(limit / 100, 1);
        int found = 0;
        for (int number = 0; number < limit; ++number) {
            const bool goesOn = number % step != 0 || report(controller, number, limit);
            if (!goesOn)
                return -1;
            found += isPrime(number) ? 1 : 0;
        }
        return found;
    }

  private:
    /// Returns whether the work continues.
    static bool report(QrProcessControl* controller, int done, int all) {
        if (!controller)
            return true;
        if (controller->isInterrupted())
            return false;
        return !controller->isProgressShown() ||
               controller->progress(static_cast<float>(done) / static_cast<float>(all),
                                    L"counting primes");
    }
};

} // namespace

MZ_COMPONENT(L"Prime counter", L"Counts prime numbers, with progress",
             Kit::builderOf<PrimeCounter>({.uid = counterUid, .name = L"counter"}))
