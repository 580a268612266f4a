// SPDX-License-Identifier: BSL-1.0
/// Stores a value of each type that streams carry, at the limits of the types.
#include "tests/checks/sound/thing.h"

#include <limits>
#include <tuple>

using namespace Mz;
using namespace Mz::Test;

namespace {

class Values final : public StoredThing<Values, 20> {
  public:
    void write(QrStream& stream) override {
        std::apply([&](const auto&... value) { (stream << ... << value); }, values);
    }
    void read(QrStream& stream) override {
        std::apply([&](auto&... value) { (stream >> ... >> value); }, values);
    }

  private:
    template <class T>
    using Limits = std::numeric_limits<T>;

    // Streams have 32 bits for a `long`.
    std::tuple<bool, unsigned char, short, unsigned short, int, unsigned int, long, unsigned long,
               int64, unsigned long long, float, double>
        values{true,
               Limits<unsigned char>::max(),
               Limits<short>::min(),
               Limits<unsigned short>::max(),
               Limits<int>::min(),
               Limits<unsigned int>::max(),
               Limits<int>::min(),
               Limits<unsigned int>::max(),
               Limits<int64>::min(),
               Limits<unsigned long long>::max(),
               0.1f,
               -1e-300};
};

} // namespace

MZ_COMPONENT(L"Values", L"Stores values of every type",
             Kit::builderOf<Values>({.uid = Values::classUid, .name = L"values"}))
