// SPDX-License-Identifier: BSL-1.0
/// The host: a controller of its own, which shows progress in steps of a quarter and stops the work
/// after a part of it, as a user would with a cancel button. It overrides three functions of
/// `Kit::Controller` and leaves the others.
#include "counter.h"

#include "components/componentKit/hostKit.h"

#include <exception>
#include <iostream>

using namespace Mz;

namespace {

class ProgressInQuarters final : public Kit::Controller {
  public:
    /// \param fraction  part of the work after which it is interrupted; more than 1 for never
    explicit ProgressInQuarters(float fraction) : stopAfter(fraction) {}

    bool isInterrupted() override { return done >= stopAfter; }
    bool isProgressShown() override { return true; }

    bool progress(float fraction, const wchar_t* text) override {
        done = fraction;
        if (const int quarter = static_cast<int>(fraction * 4); quarter != shownQuarter) {
            shownQuarter = quarter;
            std::cout << "  " << 25 * quarter << " % " << toNarrow(text, '?') << std::endl;
        }
        return true;
    }

  private:
    float stopAfter;
    float done = 0;
    int shownQuarter = -1;
};

void count(Counter& counter, int limit, float stopAfter) {
    ProgressInQuarters controller(stopAfter);
    const Kit::ControllerScope installed(controller, Kit::ControllerScope::thread);
    std::cout << "Primes below " << limit << ":" << std::endl;
    const int primes = counter.primesBelow(limit);
    if (primes < 0)
        std::cout << "  stopped" << std::endl;
    else
        std::cout << "  " << primes << std::endl;
}

} // namespace

int main() {
    const auto folder = Kit::initialize(Kit::programFolder() / "components");
    const auto counter = Kit::create<Counter>(counterUid);
    if (!counter) {
        std::cerr << "no counter was found in " << utf8Name(folder) << '\n';
        return 1;
    }
    count(*counter, 100000, 2);
    count(*counter, 100000, 0.5F);
    count(*counter, 0, 2);
    try {
        count(*counter, -1, 2);
    } catch (const std::exception& aborted) {
        std::cout << "  " << aborted.what() << std::endl;
    }
}
