// SPDX-License-Identifier: BSL-1.0
/// Stores numbers as text, which is the same in every locale of the process.
#include "tests/checks/sound/thing.h"

#include <iomanip>
#include <locale>
#include <sstream>

using namespace Mz;
using namespace Mz::Test;

namespace {

class Price final : public StoredThing<Price, 7> {
  public:
    void write(QrStream& stream) override {
        std::ostringstream text;
        text.imbue(std::locale::classic());
        text << std::fixed << std::setprecision(2) << price;
        const std::string digits = text.str();
        stream << static_cast<unsigned int>(digits.size());
        for (const char digit : digits)
            stream << static_cast<unsigned char>(digit);
    }
    void read(QrStream& stream) override {
        std::string digits;
        unsigned int count = 0;
        for (stream >> count; count > 0; --count) {
            unsigned char digit = 0;
            stream >> digit;
            digits += static_cast<char>(digit);
        }
        std::istringstream text(digits);
        text.imbue(std::locale::classic());
        text >> price;
    }

  private:
    double price = 1234567.5;
};

} // namespace

MZ_COMPONENT(L"Prices", L"Writes numbers as text",
             Kit::builderOf<Price>({.uid = Price::classUid, .name = L"price"}))
