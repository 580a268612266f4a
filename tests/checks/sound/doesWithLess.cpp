// SPDX-License-Identifier: BSL-1.0
/// Asks for more memory than there can be, catches the failure, and does with less.
#include "tests/checks/sound/thing.h"

#include <cstddef>
#include <limits>
#include <memory>
#include <new>

using namespace Mz;
using namespace Mz::Test;

namespace {

class Buffer final : public Kit::Object<Buffer, Thing> {
  public:
    Buffer() {
        // The first size is refused before an allocator sees it.
        for (size = std::numeric_limits<std::size_t>::max() / 2; size > 1 && !numbers; size >>= 54)
            allocate();
    }
    int value() const override { return numbers ? 1 : 0; }

  private:
    void allocate() {
        try {
            numbers.reset(new double[size]);
        } catch (const std::bad_alloc&) {
            numbers.reset();
        }
    }

    std::size_t size = 0;
    std::unique_ptr<double[]> numbers;
};

} // namespace

MZ_COMPONENT(L"Buffer", L"Does with less memory",
             Kit::builderOf<Buffer>({.uid = soundUid(16), .name = L"buffer"}))
