// SPDX-License-Identifier: BSL-1.0
/// Keeps what it has computed in a static table, which all threads share.
#include "tests/checks/sound/thing.h"

#include <map>
#include <mutex>

using namespace Mz;
using namespace Mz::Test;

namespace {

std::mutex tableMutex;
std::map<int, int> table;

int square(int number) {
    const std::lock_guard lock(tableMutex);
    return table.try_emplace(number, number * number).first->second;
}

class Square final : public Kit::Object<Square, Thing> {
  public:
    Square() {
        for (int number = 0; number < 50; ++number)
            sum += square(number);
    }
    int value() const override { return sum; }

  private:
    int sum = 0;
};

} // namespace

MZ_COMPONENT(L"Squares", L"Computes each square once",
             Kit::builderOf<Square>({.uid = soundUid(5), .name = L"square"}))
