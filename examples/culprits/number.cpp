// SPDX-License-Identifier: BSL-1.0
/// Numbers the lines. It relies on the end of the last line, which another filter may have removed.
#include "filter.h"

#include "components/componentKit/componentKit.h"

#include <stdexcept>

using namespace Mz;

namespace {

class Number final : public Kit::Object<Number, Filter> {
  public:
    void apply(std::string& text) override {
        std::string numbered;
        int number = 0;
        for (std::size_t begin = 0; begin < text.size();) {
            const std::size_t end = text.find('\n', begin);
            if (end == std::string::npos)
                throw std::runtime_error("a line has no end");
            numbered += std::to_string(++number) + ' ' + text.substr(begin, end - begin + 1);
            begin = end + 1;
        }
        text = numbered;
    }
};

} // namespace

MZ_COMPONENT(L"Number", L"Numbers the lines",
             Kit::builderOf<Number>({.uid = "44697D00-D21B-425F-ACCC-8C2ABE6E6316"_uid,
                                     .name = L"filter",
                                     .label = L"Number"}))
