// SPDX-License-Identifier: BSL-1.0
/// Stores a hundred thousand numbers as an array, and reads them in blocks: the count of damaged
/// data is not trusted.
#include "tests/checks/sound/thing.h"

#include "components/componentManager/exceptions.h"

#include <algorithm>
#include <vector>

using namespace Mz;
using namespace Mz::Test;

namespace {

class Samples final : public StoredThing<Samples, 14> {
  public:
    void write(QrStream& stream) override {
        stream << static_cast<unsigned int>(samples.size());
        if (!samples.empty())
            stream.write(samples.front(), static_cast<int>(samples.size()));
    }
    void read(QrStream& stream) override {
        constexpr unsigned int most = 4096;
        std::vector<double> all;
        unsigned int left = 0;
        for (stream >> left; left > 0;) {
            const unsigned int count = std::min(left, most);
            const std::size_t before = all.size();
            all.resize(before + count);
            if (stream.read(all[before], static_cast<int>(count)) != static_cast<int>(count))
                throw QrStreamEx::ExReadError("bigState", __LINE__, "a sample is missing");
            left -= count;
        }
        samples = std::move(all);
    }

  private:
    std::vector<double> samples = std::vector<double>(100'000, 0.25);
};

} // namespace

MZ_COMPONENT(L"Samples", L"Much state",
             Kit::builderOf<Samples>({.uid = Samples::classUid, .name = L"samples"}))
