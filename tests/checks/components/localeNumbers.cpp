// SPDX-License-Identifier: BSL-1.0
/// Writes a decimal point as the locale of the process says.
#include "tests/checks/components/broken.h"

#include <sstream>

class Object final : public Mz::Test::Stored {
  public:
    void write(Mz::QrStream& stream) override {
        std::ostringstream text;
        text << 0.5;
        stream << static_cast<unsigned int>(text.str().size());
        for (const char character : text.str())
            stream << character;
    }
    void read(Mz::QrStream& stream) override {
        unsigned int size = 0;
        char ignored = 0;
        for (stream >> size; size > 0; --size)
            stream >> ignored;
    }
};

MZ_BROKEN_OBJECT(Object)
