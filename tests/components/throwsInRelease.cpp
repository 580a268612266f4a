// SPDX-License-Identifier: BSL-1.0
/// Its description throws in `release`, from the MZ_TEST_RELEASE-th call on.
///
/// A registration releases twice: the reference of the entry point, and that of the cast. So does
/// each request for a builder.
#include "tests/components/testUids.h"

#include <stdexcept>
#include <string>

using namespace Mz;
using namespace Mz::Test;

namespace {

/// The code of this class is in this library, which must stay loaded while an exception exists.
class OwnException final : public std::runtime_error {
  public:
    OwnException() : std::runtime_error("in release") { note("exceptionMade"); }
    OwnException(const OwnException& other) : std::runtime_error(other) { note("exceptionMade"); }
    ~OwnException() override { note("exceptionGone"); }
};

struct Presence {
    ~Presence() { note("throwerUnloaded"); }
} presence;

class Description final : public PlainDescription {
  public:
    using PlainDescription::PlainDescription;
    long newReference() override { return note("taken"), 1; }
    long release() override {
        note("released");
        if (++releases >= MZ_TEST_RELEASE)
            throw OwnException();
        return 1;
    }

  private:
    int releases = 0;
};

} // namespace

MZ_PLAIN_ENTRY_POINT(Description, "release", {{faultyUid, L"release throws"}})
