// SPDX-License-Identifier: BSL-1.0
/// Offers builders, then throws an exception of a type that only this library defines.
#include "tests/components/testUids.h"

#include <string>

using namespace Mz;
using namespace Mz::Test;

namespace {

class OwnException {
  public:
    explicit OwnException(const char* reason) : reason(reason) {}
    OwnException(const OwnException& other) = default;
    virtual ~OwnException() { note("exceptionGone"); }

  private:
    std::string reason;
};

struct Presence {
    ~Presence() { note("throwerUnloaded"); }
} presence;

class Description final : public PlainDescription {
  public:
    using PlainDescription::PlainDescription;
    QrEnum::Action enumerateBuilders(QrEnumerator<QrCPtr<QrBuilderDescription>>& e) override {
        PlainDescription::enumerateBuilders(e);
        throw OwnException("long enough to stand on the heap, as the texts of exceptions do");
    }
};

} // namespace

MZ_PLAIN_ENTRY_POINT(Description, "thrower",
                     {{faultyUid, L"faulty"}, {goodUid, L"taken from a good one"}})
