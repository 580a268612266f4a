// SPDX-License-Identifier: BSL-1.0
/// An ordinary small plug-in library for Boost.DLL. The benchmarks make many copies of it.
#include "dllPart.h"

#include <boost/dll/alias.hpp>
#include <memory>

namespace {

class SomePart final : public DllPart {
  public:
    long value() const override { return 1; }
};

std::shared_ptr<DllPart> makePart() {
    return std::make_shared<SomePart>();
}

} // namespace

BOOST_DLL_ALIAS(makePart, mzBenchmarkPart)
